#include "spectra/cgats_reader.hpp"

#include <charconv>
#include <cmath>
#include <limits>
#include <optional>
#include <string_view>

#include "spectra/lcms_context.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "support/progress.hpp"

namespace kvdata::cli {
namespace {

std::optional<double> number(const char* text) {
  if (text == nullptr) return std::nullopt;
  std::string_view t(text);
  if (!t.empty() && t[0] == '+') t.remove_prefix(1);
  double v = 0;
  const auto r = std::from_chars(t.data(), t.data() + t.size(), v);
  if (t.empty() || r.ec != std::errc{} || r.ptr != t.data() + t.size() || !std::isfinite(v)) {
    return std::nullopt;
  }
  return v;
}

}  // namespace

SpectraTable read_cgats(const std::string& path) {
  return read_cgats(path, read_text(path));
}

SpectraTable read_cgats(const std::string& path, std::string_view text) {
  SpectraTable table;
  table.file = path;
  table.format = "CGATS";
  LcmsContext context;
  if (context.get() == nullptr) bad_input(path + ": cannot start Little CMS");
  It8Handle it8(
      cmsIT8LoadFromMem(context.get(), text.data(), static_cast<cmsUInt32Number>(text.size())));
  if (!it8) {
    bad_input(path + ": not a readable CGATS file" +
              (context.messages().empty() ? std::string() : ": " + context.messages()));
  }
  if (cmsIT8TableCount(it8.get()) > 1) cmsIT8SetTable(it8.get(), 0);

  char** names = nullptr;
  int fields = cmsIT8EnumDataFormat(it8.get(), &names);
  // A table without a BEGIN_DATA_FORMAT section has a count but no names.
  if (names == nullptr) fields = 0;
  std::vector<int> spectral;
  int name_field = -1;
  int id_field = -1;
  for (int f = 0; f < fields; ++f) {
    const std::string field = names[f] == nullptr ? "" : names[f];
    const double nm = wavelength_of(field);
    if (nm > 0) {
      spectral.push_back(f);
      table.wavelengths.push_back(nm);
    } else if (field == "SAMPLE_NAME") {
      name_field = f;
    } else if (field == "SAMPLE_ID") {
      id_field = f;
    }
  }
  if (spectral.empty()) {
    bad_input(path +
              ": no spectral fields in BEGIN_DATA_FORMAT (expected names such as "
              "SPECTRAL_NM360)");
  }
  if (name_field < 0) name_field = id_field;

  const char* sets_text = cmsIT8GetProperty(it8.get(), "NUMBER_OF_SETS");
  const auto sets = number(sets_text);
  if (!sets || *sets < 0 || *sets > std::numeric_limits<int>::max()) {
    bad_input(path + ": NUMBER_OF_SETS is missing or not a number of sets");
  }
  const auto count = static_cast<int>(*sets);

  Progress progress("reading " + path, static_cast<std::size_t>(count));
  for (int s = 0; s < count; ++s) {
    SpectrumRow row;
    row.place = static_cast<std::size_t>(s) + 1;
    if (name_field >= 0) {
      const char* name = cmsIT8GetDataRowCol(it8.get(), s, name_field);
      if (name != nullptr) row.name = name;
    }
    for (std::size_t i = 0; i < spectral.size(); ++i) {
      const char* text = cmsIT8GetDataRowCol(it8.get(), s, spectral[i]);
      const auto v = number(text);
      if (!v) {
        bad_input(
            path + " set " + std::to_string(s + 1) + ", field " + names[spectral[i]] + ": " +
            (text == nullptr ? std::string("missing value") : "not a number: " + quote(text)));
      }
      row.values.push_back(*v);
    }
    table.rows.push_back(std::move(row));
    progress.advance(static_cast<std::size_t>(s) + 1);
  }
  return table;
}

}  // namespace kvdata::cli
