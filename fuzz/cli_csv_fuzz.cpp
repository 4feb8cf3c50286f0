// The kvdata command's CSV spectra reader on fuzzed text. Where it reads a
// table, the table is written out as CSV again (names quoted, values with
// all their digits) and read back: the two tables must be the same. Every
// refusal must be an InputError.

#include <cmath>
#include <cstdio>
#include <string>

#include "fuzz_support.hpp"
#include "spectra/csv_reader.hpp"
#include "support/errors.hpp"

using namespace kvdata;

namespace {

std::string quoted(const std::string& cell) {
  std::string out = "\"";
  for (const char c : cell) {
    if (c == '"') out += '"';
    out += c;
  }
  return out + "\"";
}

std::string number(double v) {
  char buffer[40];
  std::snprintf(buffer, sizeof buffer, "%.17g", v);
  return buffer;
}

// The table as CSV: SAMPLE_NAME, then one column per wavelength.
std::string to_csv(const cli::SpectraTable& t) {
  std::string text = "SAMPLE_NAME";
  for (const double nm : t.wavelengths) text += "," + number(nm);
  text += "\n";
  for (const auto& row : t.rows) {
    text += quoted(row.name);
    for (const double v : row.values) text += "," + number(v);
    text += "\n";
  }
  return text;
}

bool same_number(double a, double b) {
  return a == b || (std::isnan(a) && std::isnan(b));
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);
  cli::SpectraTable first;
  try {
    first = cli::read_csv("fuzz.csv", text);
  } catch (const cli::InputError&) {
    return 0;
  }
  for (const auto& row : first.rows) {
    KVDATA_FUZZ_CHECK(row.values.size() == first.wavelengths.size(),
                      "a row has another number of values than the table has wavelengths");
  }
  cli::SpectraTable second;
  try {
    second = cli::read_csv("again.csv", to_csv(first));
  } catch (const std::exception& e) {
    std::fprintf(stderr, "%s\n", e.what());
    KVDATA_FUZZ_CHECK(false, "a table that was read cannot be read again once written out");
  }
  KVDATA_FUZZ_CHECK(second.wavelengths == first.wavelengths, "wavelengths changed on a round trip");
  KVDATA_FUZZ_CHECK(second.rows.size() == first.rows.size(), "rows changed on a round trip");
  for (std::size_t r = 0; r < first.rows.size(); ++r) {
    KVDATA_FUZZ_CHECK(second.rows[r].name == first.rows[r].name, "a name changed on a round trip");
    for (std::size_t i = 0; i < first.rows[r].values.size(); ++i) {
      KVDATA_FUZZ_CHECK(same_number(second.rows[r].values[i], first.rows[r].values[i]),
                        "a value changed on a round trip");
    }
  }
  return 0;
}
