// The kvdata command's CGATS spectra reader on fuzzed file contents. Where
// it reads a table, the table is written with the command's CGATS writer and
// read back: names, wavelengths and values must come back (values to the
// precision the writer prints). Every refusal must be an InputError.

#include <unistd.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <string>

#include "fuzz_support.hpp"
#include "spectra/cgats_reader.hpp"
#include "spectra/cgats_writer.hpp"
#include "support/errors.hpp"

using namespace kvdata;

namespace {

std::string& directory() {
  static std::string dir;
  return dir;
}

void write_file(const std::string& path, const char* data, std::size_t size) {
  std::FILE* file = std::fopen(path.c_str(), "wb");
  if (file == nullptr) std::abort();
  if (size > 0 && std::fwrite(data, 1, size, file) != size) std::abort();
  if (std::fclose(file) != 0) std::abort();
}

std::string number(double v) {
  char buffer[40];
  std::snprintf(buffer, sizeof buffer, "%.17g", v);
  return buffer;
}

bool close_enough(double a, double b) {
  if (a == b || (std::isnan(a) && std::isnan(b))) return true;
  return std::fabs(a - b) <= 1e-9 * std::fmax(std::fabs(a), std::fabs(b));
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  char shm_pattern[] = "/dev/shm/kvdata-cgats-XXXXXX";
  char tmp_pattern[] = "/tmp/kvdata-cgats-XXXXXX";
  const char* made = ::mkdtemp(shm_pattern);
  if (made == nullptr) made = ::mkdtemp(tmp_pattern);
  if (made == nullptr) std::abort();
  directory() = made;
  std::atexit([] {
    std::remove((directory() + "/in.cgats").c_str());
    std::remove((directory() + "/again.cgats").c_str());
    ::rmdir(directory().c_str());
  });
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string in = directory() + "/in.cgats";
  write_file(in, reinterpret_cast<const char*>(data), size);
  cli::SpectraTable first;
  try {
    first = cli::read_cgats(in);
  } catch (const cli::InputError&) {
    return 0;
  }
  std::vector<std::string> fields = {"SAMPLE_NAME"};
  for (const double nm : first.wavelengths) fields.push_back("SPECTRAL_NM" + number(nm));
  std::vector<std::vector<std::string>> rows;
  for (const auto& row : first.rows) {
    KVDATA_FUZZ_CHECK(row.values.size() == first.wavelengths.size(),
                      "a set has another number of values than the table has wavelengths");
    // Sets without a name are written under the label the command gives them.
    std::vector<std::string> cells = {first.label(row)};
    for (const double v : row.values) cells.push_back(number(v));
    rows.push_back(std::move(cells));
  }
  cli::SpectraTable second;
  try {
    const std::string text = cli::write_cgats("fuzz", fields, rows);
    const std::string again = directory() + "/again.cgats";
    write_file(again, text.data(), text.size());
    second = cli::read_cgats(again);
  } catch (const std::exception& e) {
    std::fprintf(stderr, "%s\n", e.what());
    KVDATA_FUZZ_CHECK(false, "a table that was read cannot be read again once written out");
  }
  KVDATA_FUZZ_CHECK(second.wavelengths == first.wavelengths, "wavelengths changed on a round trip");
  KVDATA_FUZZ_CHECK(second.rows.size() == first.rows.size(), "sets changed on a round trip");
  for (std::size_t r = 0; r < first.rows.size(); ++r) {
    if (second.rows[r].name != first.label(first.rows[r])) {
      std::fprintf(stderr, "set %zu: [%s] came back as [%s]\n", r,
                   first.label(first.rows[r]).c_str(), second.rows[r].name.c_str());
      KVDATA_FUZZ_CHECK(false, "a name changed on a round trip");
    }
    for (std::size_t i = 0; i < first.rows[r].values.size(); ++i) {
      KVDATA_FUZZ_CHECK(close_enough(second.rows[r].values[i], first.rows[r].values[i]),
                        "a value changed on a round trip");
    }
  }
  return 0;
}
