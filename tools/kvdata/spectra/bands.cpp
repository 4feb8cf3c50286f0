#include "spectra/bands.hpp"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <iostream>
#include <optional>

#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

constexpr double kFirstNm = 360.0;
constexpr double kStepNm = 10.0;
constexpr double kLastNm = kFirstNm + 39 * kStepNm;
constexpr const char* kBands = "the 40 bands from 360 to 750 nm at 10 nm";

std::string nm_text(double nm) {
  if (nm == std::floor(nm)) return std::to_string(static_cast<long long>(nm));
  char buf[32];
  std::snprintf(buf, sizeof buf, "%g", nm);
  return buf;
}

std::optional<std::size_t> column_at(const std::vector<double>& wavelengths, double nm) {
  for (std::size_t i = 0; i < wavelengths.size(); ++i) {
    if (std::fabs(wavelengths[i] - nm) < 1e-6) return i;
  }
  return std::nullopt;
}

// "760 nm", "355, 365 and 760 nm", or coverage() of more.
std::string listed(const std::vector<double>& wl) {
  if (wl.size() > 4) return coverage(wl);
  std::string text;
  for (std::size_t i = 0; i < wl.size(); ++i) {
    if (i > 0) text += i + 1 == wl.size() ? " and " : ", ";
    text += nm_text(wl[i]);
  }
  return text + " nm";
}

// Says once, on standard error, which of the file's wavelengths are none of
// the bands: below or above them, or between them.
void warn_unused(const std::string& file, std::vector<double> wavelengths) {
  std::sort(wavelengths.begin(), wavelengths.end());
  std::vector<double> below, between, above;
  for (const double nm : wavelengths) {
    const double band = (nm - kFirstNm) / kStepNm;
    if (nm < kFirstNm - 1e-6) {
      below.push_back(nm);
    } else if (nm > kLastNm + 1e-6) {
      above.push_back(nm);
    } else if (std::fabs(band - std::round(band)) * kStepNm >= 1e-6) {
      between.push_back(nm);
    }
  }
  std::string parts;
  const std::pair<const std::vector<double>*, const char*> groups[] = {
      {&below, " below 360 nm"}, {&between, " between the bands"}, {&above, " above 750 nm"}};
  for (const auto& [group, where] : groups) {
    if (group->empty()) continue;
    if (!parts.empty()) parts += ", ";
    parts += listed(*group) + where;
  }
  if (parts.empty()) return;
  std::cerr << "kvdata: warning: " << file << ": not used: " << parts << "; only " << kBands
            << " are used\n";
}

}  // namespace

std::string coverage(const std::vector<double>& wl) {
  if (wl.empty()) return "no wavelengths";
  if (wl.size() == 1) return "only " + nm_text(wl[0]) + " nm";
  const double step = wl[1] - wl[0];
  bool uniform = true;
  for (std::size_t i = 2; i < wl.size(); ++i) {
    uniform = uniform && std::fabs((wl[i] - wl[i - 1]) - step) < 1e-6;
  }
  std::string text = nm_text(wl.front()) + " to " + nm_text(wl.back()) + " nm";
  if (uniform) text += " at " + nm_text(step) + " nm";
  return text + " (" + std::to_string(wl.size()) + " wavelengths)";
}

std::array<std::size_t, 40> band_columns(const std::string& file,
                                         const std::vector<double>& wavelengths, bool extend) {
  // Column of each band, or none.
  std::optional<std::size_t> column[41];
  int first = 0;
  int last = 0;
  for (int band = 1; band <= 40; ++band) {
    column[band] = column_at(wavelengths, kFirstNm + kStepNm * (band - 1));
    if (column[band]) {
      if (first == 0) first = band;
      last = band;
    }
  }
  std::string missing;
  bool inner_gap = false;
  for (int band = 1; band <= 40; ++band) {
    if (column[band]) continue;
    if (!missing.empty()) missing += ", ";
    missing += nm_text(kFirstNm + kStepNm * (band - 1));
    inner_gap = inner_gap || (first != 0 && band > first && band < last);
  }
  if (!missing.empty() && (!extend || inner_gap || first == 0)) {
    std::vector<double> ordered = wavelengths;
    std::sort(ordered.begin(), ordered.end());
    std::string message = file + ": the spectra cover " + coverage(ordered) + "; " + kBands +
                          " are needed (missing: " + missing + " nm).";
    if (inner_gap || first == 0) {
      message += " Bands missing inside the range cannot be filled.";
    } else {
      message += " --extend fills missing end bands by repeating the nearest measured value.";
    }
    bad_input(message);
  }
  std::array<std::size_t, 40> columns{};
  for (int band = 1; band <= 40; ++band) {
    const int from = band < first ? first : band > last ? last : band;
    columns[static_cast<std::size_t>(band - 1)] = *column[from];
  }
  warn_unused(file, wavelengths);
  return columns;
}

std::vector<tSpectrum> to_bands(const SpectraTable& table, bool extend) {
  const std::array<std::size_t, 40> columns = band_columns(table.file, table.wavelengths, extend);
  std::vector<tSpectrum> spectra;
  spectra.reserve(table.rows.size());
  for (const SpectrumRow& row : table.rows) {
    tSpectrum s;
    for (int band = 1; band <= 40; ++band) {
      s.Data(band) = static_cast<Single>(row.values[columns[static_cast<std::size_t>(band - 1)]]);
    }
    spectra.push_back(s);
  }
  return spectra;
}

}  // namespace kvdata::cli
