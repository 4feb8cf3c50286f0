#include "spectra/csv_reader.hpp"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>
#include <cstdint>

#include "support/errors.hpp"
#include "support/progress.hpp"

namespace kvdata::cli {
namespace {

std::string_view trim(std::string_view s) {
  const char* b = s.data();
  const char* e = b + s.size();
  while (b < e && (*b == ' ' || *b == '\t')) ++b;
  while (e > b && (e[-1] == ' ' || e[-1] == '\t')) --e;
  return std::string_view(b, static_cast<std::size_t>(e - b));
}

// Powers of ten that a double holds exactly.
constexpr double kExactPowers[] = {1e0,  1e1,  1e2,  1e3,  1e4,  1e5,  1e6,  1e7,
                                   1e8,  1e9,  1e10, 1e11, 1e12, 1e13, 1e14, 1e15,
                                   1e16, 1e17, 1e18, 1e19, 1e20, 1e21, 1e22};

// The usual cell, a plain decimal such as "-12.345": its digits as an
// integer divided by an exact power of ten, both exact doubles, so the one
// rounded division gives the correctly rounded value, the same double that
// std::from_chars gives. False for anything else (exponents, more digits
// than a double holds exactly, stray characters), which from_chars decides.
bool plain_decimal(const char* p, const char* last, double& v) {
  const bool negative = p < last && *p == '-';
  if (negative) ++p;
  // Digits wrap past 19 of them; such a cell is left to from_chars.
  std::uint64_t digits = 0;
  const char* const whole = p;
  while (p < last && static_cast<unsigned>(*p - '0') < 10) {
    digits = 10 * digits + static_cast<unsigned>(*p - '0');
    ++p;
  }
  const auto whole_count = p - whole;
  std::ptrdiff_t decimals = 0;
  if (p < last && *p == '.') {
    const char* const fraction = ++p;
    while (p < last && static_cast<unsigned>(*p - '0') < 10) {
      digits = 10 * digits + static_cast<unsigned>(*p - '0');
      ++p;
    }
    decimals = p - fraction;
  }
  const auto count = whole_count + decimals;
  if (p != last || count == 0 || count > 19 || digits > (std::uint64_t{1} << 53) || decimals > 22) {
    return false;
  }
  const double magnitude = static_cast<double>(digits) / kExactPowers[decimals];
  v = negative ? -magnitude : magnitude;
  return true;
}

std::string upper(std::string_view s) {
  std::string u(s);
  std::transform(u.begin(), u.end(), u.begin(),
                 [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
  return u;
}

// A finite decimal number, blanks around it and a leading '+' allowed.
bool number(std::string_view cell, double& v) {
  const std::string_view t = trim(cell);
  if (t.empty()) return false;
  const char* first = t.data();
  const char* const last = t.data() + t.size();
  if (*first == '+') ++first;
  if (plain_decimal(first, last, v)) return true;
  const auto r = std::from_chars(first, last, v);
  return r.ec == std::errc{} && r.ptr == last && std::isfinite(v);
}

}  // namespace

CsvSpectraReader::CsvSpectraReader(std::string path, CsvRecords records)
    : path_(std::move(path)), records_(std::move(records)) {
  if (!records_.next()) {
    bad_input(path_ + ": is empty; expected a header row and one sample per row");
  }
  int name_rank = 99;
  constexpr const char* kNameColumns[] = {"SAMPLE_NAME", "SAMPLE_ID", "NAME",
                                          "SAMPLE",      "ID",        "LABEL"};
  const auto header = records_.cells();
  for (std::size_t c = 0; c < header.size(); ++c) {
    titles_.emplace_back(trim(header[c]));
    const std::string& title = titles_.back();
    const double nm = wavelength_of(title);
    if (nm > 0) {
      spectral_.push_back(c);
      wavelengths_.push_back(nm);
      continue;
    }
    for (int rank = 0; rank < 6; ++rank) {
      if (upper(title) == kNameColumns[rank] && rank < name_rank) {
        name_rank = rank;
        name_column_ = c;
      }
    }
  }
  if (spectral_.empty()) {
    bad_input(path_ + " line " + std::to_string(records_.line()) +
              ": no wavelength columns in the header (expected names such as 360, nm360 or "
              "SPECTRAL_NM360)");
  }
  if (!name_column_ && spectral_.front() != 0) name_column_ = 0;
}

bool CsvSpectraReader::next(std::span<double> values) {
  if (!records_.next()) return false;
  const auto cells = records_.cells();
  if (cells.size() != titles_.size()) {
    bad_input(path_ + " line " + std::to_string(records_.line()) + ": " +
              std::to_string(cells.size()) + " cells, but the header has " +
              std::to_string(titles_.size()));
  }
  name_ = name_column_ ? trim(cells[*name_column_]) : std::string_view{};
  for (std::size_t i = 0; i < spectral_.size(); ++i) {
    const std::string_view cell = cells[spectral_[i]];
    if (!number(cell, values[i])) {
      bad_input(path_ + " line " + std::to_string(records_.line()) + ", column " +
                titles_[spectral_[i]] + ": not a number: \"" + std::string(trim(cell)) + "\"");
    }
  }
  return true;
}

SpectraTable read_csv(const std::string& path, const std::string& text) {
  SpectraTable table;
  table.file = path;
  table.format = "CSV";
  CsvSpectraReader reader(path, CsvRecords(path, text));
  table.wavelengths = reader.wavelengths();
  std::vector<double> values(table.wavelengths.size());
  Progress progress("reading " + path, text.size(), std::size_t{1} << 20, "bytes");
  while (reader.next(values)) {
    table.rows.push_back(SpectrumRow{std::string(reader.name()), reader.line(), values});
    progress.advance(reader.bytes_read());
  }
  return table;
}

}  // namespace kvdata::cli
