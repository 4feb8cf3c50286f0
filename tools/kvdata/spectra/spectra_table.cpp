#include "spectra/spectra_table.hpp"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <numeric>

#include "spectra/cgats_reader.hpp"
#include "spectra/csv_reader.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"

namespace kvdata::cli {

std::string SpectraTable::where(const SpectrumRow& row) const {
  return file + (format == "CGATS" ? " set " : " line ") + std::to_string(row.place);
}

std::string SpectraTable::label(const SpectrumRow& row) const {
  if (!row.name.empty()) return row.name;
  return (format == "CGATS" ? "set " : "line ") + std::to_string(row.place);
}

namespace {

// The offset of the first byte that does not belong to a well-formed UTF-8
// sequence (no overlong forms, surrogates or values past U+10FFFF), or
// npos.
std::size_t invalid_utf8_at(std::string_view text) {
  std::size_t i = 0;
  while (i < text.size()) {
    const auto c = static_cast<unsigned char>(text[i]);
    std::size_t more = 0;
    unsigned char low = 0x80;
    unsigned char high = 0xBF;
    if (c < 0x80) {
      more = 0;
    } else if (c >= 0xC2 && c <= 0xDF) {
      more = 1;
    } else if (c >= 0xE0 && c <= 0xEF) {
      more = 2;
      if (c == 0xE0) low = 0xA0;
      if (c == 0xED) high = 0x9F;
    } else if (c >= 0xF0 && c <= 0xF4) {
      more = 3;
      if (c == 0xF0) low = 0x90;
      if (c == 0xF4) high = 0x8F;
    } else {
      return i;
    }
    for (std::size_t k = 1; k <= more; ++k) {
      if (i + k >= text.size()) return i;
      const auto next = static_cast<unsigned char>(text[i + k]);
      if (next < (k == 1 ? low : 0x80) || next > (k == 1 ? high : 0xBF)) return i;
    }
    i += more + 1;
  }
  return std::string_view::npos;
}

}  // namespace

void check_sample_name(std::string_view name, const std::string& where) {
  const std::size_t at = invalid_utf8_at(name);
  if (at == std::string_view::npos) return;
  static constexpr char kHex[] = "0123456789ABCDEF";
  const auto byte = static_cast<unsigned char>(name[at]);
  bad_input(where + ": the sample name is not UTF-8 text (byte 0x" + kHex[byte >> 4] +
            kHex[byte & 0xF] + " after \"" + std::string(name.substr(0, at)) +
            "\"); save the file as UTF-8");
}

double wavelength_of(const std::string& column) {
  // Letters, blanks and underscores, then the number, then an optional "nm".
  std::size_t i = 0;
  while (i < column.size() && (std::isalpha(static_cast<unsigned char>(column[i])) ||
                               column[i] == '_' || column[i] == ' ')) {
    ++i;
  }
  if (i == column.size() || !std::isdigit(static_cast<unsigned char>(column[i]))) return -1;
  double nm = 0;
  const auto r = std::from_chars(column.data() + i, column.data() + column.size(), nm);
  if (r.ec != std::errc{}) return -1;
  std::string rest(r.ptr, column.data() + column.size());
  rest.erase(std::remove(rest.begin(), rest.end(), ' '), rest.end());
  std::transform(rest.begin(), rest.end(), rest.begin(),
                 [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
  if (!rest.empty() && rest != "nm") return -1;
  if (nm < 300 || nm > 1100) return -1;
  return nm;
}

void order_columns(SpectraTable& table) {
  std::vector<std::size_t> order(table.wavelengths.size());
  std::iota(order.begin(), order.end(), std::size_t{0});
  std::stable_sort(order.begin(), order.end(), [&](std::size_t a, std::size_t b) {
    return table.wavelengths[a] < table.wavelengths[b];
  });
  std::vector<double> wl;
  for (std::size_t i : order) wl.push_back(table.wavelengths[i]);
  for (std::size_t i = 1; i < wl.size(); ++i) {
    if (wl[i] == wl[i - 1]) {
      bad_input(table.file + ": the wavelength " + std::to_string(static_cast<long long>(wl[i])) +
                " nm has two columns");
    }
  }
  for (SpectrumRow& row : table.rows) {
    std::vector<double> v;
    for (std::size_t i : order) v.push_back(row.values[i]);
    row.values = std::move(v);
  }
  table.wavelengths = std::move(wl);
}

SpectraTable read_spectra(const std::string& path) {
  return read_spectra(path, read_text(path));
}

SpectraTable read_spectra(const std::string& path, const std::string& text) {
  const Activity reading(path + ": reading the spectra");
  SpectraTable table = text.find("BEGIN_DATA_FORMAT") != std::string::npos ? read_cgats(path, text)
                                                                           : read_csv(path, text);
  order_columns(table);
  for (const SpectrumRow& row : table.rows) check_sample_name(row.name, table.where(row));
  if (table.rows.empty()) bad_input(path + ": holds no spectra (no data rows)");
  return table;
}

}  // namespace kvdata::cli
