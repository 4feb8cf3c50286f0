#include "json/dates.hpp"

#include <bit>
#include <cmath>
#include <cstdint>
#include <cstdio>

#include "json/fields.hpp"
#include "json/numbers.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

constexpr long long kMsPerDay = 86'400'000;
// Day number of 1899-12-30 counted from 1970-01-01.
constexpr long long kEpochOffset = -25'569;

// Days since 1970-01-01 of a proleptic Gregorian date.
constexpr long long days_from_civil(long long y, unsigned m, unsigned d) {
  y -= m <= 2;
  const long long era = (y >= 0 ? y : y - 399) / 400;
  const auto yoe = static_cast<unsigned>(y - era * 400);
  const unsigned doy = (153 * (m > 2 ? m - 3 : m + 9) + 2) / 5 + d - 1;
  const unsigned doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
  return era * 146097 + static_cast<long long>(doe) - 719468;
}

struct Civil {
  long long y;
  unsigned m;
  unsigned d;
};

constexpr Civil civil_from_days(long long z) {
  z += 719468;
  const long long era = (z >= 0 ? z : z - 146096) / 146097;
  const auto doe = static_cast<unsigned>(z - era * 146097);
  const unsigned yoe = (doe - doe / 1460 + doe / 36524 - doe / 146096) / 365;
  const unsigned doy = doe - (365 * yoe + yoe / 4 - yoe / 100);
  const unsigned mp = (5 * doy + 2) / 153;
  const unsigned d = doy - (153 * mp + 2) / 5 + 1;
  const unsigned m = mp < 10 ? mp + 3 : mp - 9;
  return {static_cast<long long>(yoe) + era * 400 + (m <= 2), m, d};
}

static_assert(days_from_civil(1899, 12, 30) == kEpochOffset);

constexpr bool leap(long long y) {
  return (y % 4 == 0 && y % 100 != 0) || y % 400 == 0;
}

constexpr unsigned days_in_month(long long y, unsigned m) {
  constexpr unsigned kDays[] = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
  return m == 2 && leap(y) ? 29 : kDays[m - 1];
}

double compose(long long day, long long ms) {
  return static_cast<double>(day) + static_cast<double>(ms) / static_cast<double>(kMsPerDay);
}

bool same_bits(double a, double b) {
  return std::bit_cast<std::uint64_t>(a) == std::bit_cast<std::uint64_t>(b);
}

// Reads exactly `n` digits at `pos`.
bool digits(std::string_view text, std::size_t& pos, std::size_t n, unsigned& out) {
  if (pos + n > text.size()) return false;
  out = 0;
  for (std::size_t i = 0; i < n; ++i) {
    const char c = text[pos + i];
    if (c < '0' || c > '9') return false;
    out = out * 10 + static_cast<unsigned>(c - '0');
  }
  pos += n;
  return true;
}

bool expect(std::string_view text, std::size_t& pos, char c) {
  if (pos >= text.size() || text[pos] != c) return false;
  ++pos;
  return true;
}

}  // namespace

std::optional<std::string> iso_text(Date date) {
  const double d = date.days;
  if (!std::isfinite(d)) return std::nullopt;
  const double whole = std::floor(d);
  if (whole < -657'434.0 || whole > 2'958'465.0) return std::nullopt;  // 0001-01-01 .. 9999-12-31
  const auto day = static_cast<long long>(whole);
  const auto ms =
      static_cast<long long>(std::llround((d - whole) * static_cast<double>(kMsPerDay)));
  if (ms >= kMsPerDay || (day < 0 && ms != 0)) return std::nullopt;
  if (!same_bits(compose(day, ms), d)) return std::nullopt;

  const Civil c = civil_from_days(day + kEpochOffset);
  const int year = static_cast<int>(c.y);  // 1 to 9999, checked above
  char buf[128];
  if (ms == 0) {
    std::snprintf(buf, sizeof buf, "%04d-%02u-%02u", year, c.m, c.d);
  } else {
    const int h = static_cast<int>(ms / 3'600'000);
    const int mi = static_cast<int>(ms / 60'000 % 60);
    const int s = static_cast<int>(ms / 1000 % 60);
    const int milli = static_cast<int>(ms % 1000);
    if (milli == 0) {
      std::snprintf(buf, sizeof buf, "%04d-%02u-%02uT%02d:%02d:%02d", year, c.m, c.d, h, mi, s);
    } else {
      std::snprintf(buf, sizeof buf, "%04d-%02u-%02uT%02d:%02d:%02d.%03d", year, c.m, c.d, h, mi, s,
                    milli);
    }
  }
  return std::string(buf);
}

std::optional<Date> parse_iso(std::string_view text) {
  std::size_t pos = 0;
  unsigned y = 0, m = 0, d = 0;
  if (!digits(text, pos, 4, y) || !expect(text, pos, '-') || !digits(text, pos, 2, m) ||
      !expect(text, pos, '-') || !digits(text, pos, 2, d)) {
    return std::nullopt;
  }
  if (y < 1 || m < 1 || m > 12 || d < 1 || d > days_in_month(y, m)) return std::nullopt;
  long long ms = 0;
  if (pos < text.size()) {
    unsigned h = 0, mi = 0, s = 0, milli = 0;
    if (!expect(text, pos, 'T') || !digits(text, pos, 2, h) || !expect(text, pos, ':') ||
        !digits(text, pos, 2, mi) || !expect(text, pos, ':') || !digits(text, pos, 2, s)) {
      return std::nullopt;
    }
    if (pos < text.size() && (!expect(text, pos, '.') || !digits(text, pos, 3, milli))) {
      return std::nullopt;
    }
    if (pos != text.size() || h > 23 || mi > 59 || s > 59) return std::nullopt;
    ms = ((static_cast<long long>(h) * 60 + mi) * 60 + s) * 1000 + milli;
  }
  const long long day = days_from_civil(y, m, d) - kEpochOffset;
  if (day < 0 && ms != 0) return std::nullopt;
  return Date{compose(day, ms)};
}

Json date_to_json(Date d) {
  if (auto text = iso_text(d)) return *text;
  return double_to_json(d.days);
}

Date date_from_json(const Json& j, std::string_view path) {
  if (j.is_string()) {
    if (auto d = parse_iso(j.get_ref<const std::string&>())) return *d;
  }
  if (j.is_string() || j.is_number()) {
    try {
      return Date{double_from_json(j, path)};
    } catch (const InputError&) {
    }
  }
  bad_input(std::string(path) +
            ": expected a date (\"YYYY-MM-DD\", \"YYYY-MM-DDThh:mm:ss[.mmm]\" " +
            "or a number of days since 1899-12-30), found " + describe(j));
}

}  // namespace kvdata::cli
