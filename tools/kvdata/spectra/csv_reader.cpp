#include "spectra/csv_reader.hpp"

#include <algorithm>
#include <bit>
#include <cctype>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>

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
// integer over an exact power of ten, both exact doubles, so the one rounded
// division numerator / denominator gives the correctly rounded value, the
// same double that std::from_chars gives. False for anything else
// (exponents, more digits than a double holds exactly, stray characters),
// which from_chars decides. The division is left to the caller, so that a
// row's divisions run together.
bool plain_decimal(const char* p, const char* last, double& numerator, double& denominator) {
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
  // -(a / b) and (-a) / b round alike.
  numerator = negative ? -static_cast<double>(digits) : static_cast<double>(digits);
  denominator = kExactPowers[decimals];
  return true;
}

// The same for a cell of at most eight characters, digits with at most one
// point (a leading '-' aside), taken eight bytes at a time: `p` may be read
// CsvRecords::kReadAhead bytes past `last`. False for any other cell, which
// plain_decimal() then decides: both give the same numerator and
// denominator wherever this one answers.
bool short_decimal(const char* p, const char* last, double& numerator, double& denominator) {
  const bool negative = p < last && *p == '-';
  if (negative) ++p;
  const auto length = static_cast<std::size_t>(last - p);
  if (length == 0 || length > 8) return false;
  std::uint64_t word = 0;
  std::memcpy(&word, p, 8);
  if constexpr (std::endian::native != std::endian::little) return false;
  // The cell's bytes, low byte first; the bytes after it cleared.
  if (length < 8) word &= (std::uint64_t{1} << (8 * length)) - 1;
  // The point, if any: its bytes become zero under the xor.
  constexpr std::uint64_t kOnes = 0x0101010101010101u;
  constexpr std::uint64_t kHighs = 0x8080808080808080u;
  const std::uint64_t dots = word ^ (kOnes * '.');
  std::uint64_t zero = (dots - kOnes) & ~dots & kHighs;
  if (length < 8) zero &= (std::uint64_t{1} << (8 * length)) - 1;
  std::size_t digits_count = length;
  std::size_t decimals = 0;
  if (zero != 0) {
    const auto at = static_cast<std::size_t>(std::countr_zero(zero)) / 8;
    // The bytes after the point move down over it.
    const std::uint64_t below = (std::uint64_t{1} << (8 * at)) - 1;
    word = (word & below) | ((word >> 8) & ~below);
    digits_count = length - 1;
    decimals = length - 1 - at;
    if (digits_count == 0) return false;
  }
  // Right-aligned as eight digits, first digit in the low byte: '0's in front.
  const std::size_t pad = 8 - digits_count;
  word = pad == 8 ? 0 : (word << (8 * pad));
  if (pad > 0) word |= (kOnes * '0') & ((std::uint64_t{1} << (8 * pad)) - 1);
  // Every byte a digit (a second point, a blank or a sign is not).
  if ((((word & 0xF0F0F0F0F0F0F0F0u) |
        (((word + 0x0606060606060606u) & 0xF0F0F0F0F0F0F0F0u) >> 4)) != 0x3333333333333333u)) {
    return false;
  }
  word = (word & 0x0F0F0F0F0F0F0F0Fu) * 2561 >> 8;
  word = (word & 0x00FF00FF00FF00FFu) * 6553601 >> 16;
  const auto value =
      static_cast<std::uint32_t>((word & 0x0000FFFF0000FFFFu) * 42949672960001u >> 32);
  numerator = negative ? -static_cast<double>(value) : static_cast<double>(value);
  denominator = kExactPowers[decimals];
  return true;
}

std::string upper(std::string_view s) {
  std::string u(s);
  std::transform(u.begin(), u.end(), u.begin(),
                 [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
  return u;
}

// A finite decimal number, blanks around it and a leading '+' allowed, as
// numerator / denominator (denominator 1 for a number from_chars read).
// `padded`: the cell may be read CsvRecords::kReadAhead bytes past its end.
bool number(std::string_view cell, bool padded, double& numerator, double& denominator) {
  if (padded && short_decimal(cell.data(), cell.data() + cell.size(), numerator, denominator)) {
    return true;
  }
  const std::string_view t = trim(cell);
  if (t.empty()) return false;
  const char* first = t.data();
  const char* const last = t.data() + t.size();
  if (*first == '+') ++first;
  if (plain_decimal(first, last, numerator, denominator)) return true;
  denominator = 1;
  const auto r = std::from_chars(first, last, numerator);
  return r.ec == std::errc{} && r.ptr == last && std::isfinite(numerator);
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
  denominators_.resize(spectral_.size());
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
  check_sample_name(name_, path_ + " line " + std::to_string(records_.line()));
  const std::size_t n = spectral_.size();
  const bool padded = records_.cells_in_block();
  for (std::size_t i = 0; i < n; ++i) {
    const std::string_view cell = cells[spectral_[i]];
    if (!number(cell, padded, values[i], denominators_[i])) {
      bad_input(path_ + " line " + std::to_string(records_.line()) + ", column " +
                titles_[spectral_[i]] + ": not a number: " + quote(trim(cell)));
    }
  }
  // The divisions of the row one after another, free of the parsing's branches.
  for (std::size_t i = 0; i < n; ++i) values[i] /= denominators_[i];
  return true;
}

SpectraTable read_csv(const std::string& path, const std::string& text) {
  SpectraTable table;
  table.file = path;
  table.format = "CSV";
  CsvSpectraReader reader(path, CsvRecords(path, text));
  table.wavelengths = reader.wavelengths();
  table.named = reader.named();
  std::vector<double> values(table.wavelengths.size());
  Progress progress("reading " + path, text.size(), std::size_t{1} << 20, "bytes");
  while (reader.next(values)) {
    table.rows.push_back(SpectrumRow{std::string(reader.name()), reader.line(), values});
    progress.advance(reader.bytes_read());
  }
  return table;
}

}  // namespace kvdata::cli
