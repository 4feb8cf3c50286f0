#include "kvdata/automation/variant.hpp"

#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <string>

#include "kvdata/automation/text.hpp"

namespace kvdata {
namespace {

template <class... Fs>
struct Overloaded : Fs... {
  using Fs::operator()...;
};
template <class... Fs>
Overloaded(Fs...) -> Overloaded<Fs...>;

VarType array_type(VarType element) {
  return static_cast<VarType>(static_cast<int>(VarType::Array) + static_cast<int>(element));
}

// Shortest decimal text with at most `digits` significant digits, as the
// automation runtime prints numbers: "5", "0.1", "1E+20", "1.5E-07".
String format_number(double value, int digits) {
  if (std::isnan(value)) return u"NaN";
  if (std::isinf(value)) return value > 0 ? u"Infinity" : u"-Infinity";
  char buf[64];
  std::snprintf(buf, sizeof buf, "%.*G", digits, value);
  std::string s(buf);
  // %G keeps two exponent digits and a sign, as wanted; trailing zeros of the
  // mantissa are already removed by %G.
  if (s == "-0") s = "0";
  return String(s.begin(), s.end());
}

// Civil date from days since 1970-01-01 (proleptic Gregorian calendar).
void civil_from_days(long long z, long long& y, unsigned& m, unsigned& d) {
  z += 719468;
  const long long era = (z >= 0 ? z : z - 146096) / 146097;
  const auto doe = static_cast<unsigned>(z - era * 146097);
  const unsigned yoe = (doe - doe / 1460 + doe / 36524 - doe / 146096) / 365;
  y = static_cast<long long>(yoe) + era * 400;
  const unsigned doy = doe - (365 * yoe + yoe / 4 - yoe / 100);
  const unsigned mp = (5 * doy + 2) / 153;
  d = doy - (153 * mp + 2) / 5 + 1;
  m = mp < 10 ? mp + 3 : mp - 9;
  if (m <= 2) ++y;
}

// A Date as ISO 8601 text: "2024-05-17" for a whole day, with " 13:45:00"
// when it has a time of day. Values outside years 100..9999 print as numbers.
String format_date(Date date) {
  const double days = date.days;
  if (!std::isfinite(days) || days < -657434.0 || days >= 2958466.0) {
    return format_number(days, 15);
  }
  // Automation dates before 1899-12-30 count the fraction forwards from the
  // day's start, with the whole part negative: -1.25 is 1899-12-29 06:00.
  const double whole = std::trunc(days);
  const double frac = std::fabs(days - whole);
  long long seconds = std::llround(frac * 86400.0);
  long long day = static_cast<long long>(whole);
  if (seconds >= 86400) {
    seconds -= 86400;
    day += days < 0 ? -1 : 1;
  }
  long long y = 0;
  unsigned m = 0;
  unsigned d = 0;
  civil_from_days(day - 25569, y, m, d);  // 1899-12-30 is 25569 days before 1970-01-01
  char buf[64];
  if (seconds == 0) {
    std::snprintf(buf, sizeof buf, "%04lld-%02u-%02u", y, m, d);
  } else {
    std::snprintf(buf, sizeof buf, "%04lld-%02u-%02u %02lld:%02lld:%02lld", y, m, d, seconds / 3600,
                  (seconds / 60) % 60, seconds % 60);
  }
  std::string s(buf);
  return String(s.begin(), s.end());
}

// Parses decimal text as the automation runtime does for numbers: optional
// blanks, sign, digits, fraction and exponent. Anything else is error 13.
double parse_number(const String& text) {
  std::string s;
  s.reserve(text.size());
  for (char16_t c : text) {
    if (c > 0x7F) raise(kTypeMismatch);
    s.push_back(static_cast<char>(c));
  }
  const auto first = s.find_first_not_of(" \t");
  const auto last = s.find_last_not_of(" \t");
  if (first == std::string::npos) raise(kTypeMismatch);
  s = s.substr(first, last - first + 1);
  // Only plain decimal forms: reject hex floats, inf and nan spellings.
  for (char c : s) {
    if (!((c >= '0' && c <= '9') || c == '.' || c == '+' || c == '-' || c == 'e' || c == 'E')) {
      raise(kTypeMismatch);
    }
  }
  errno = 0;
  char* end = nullptr;
  const double value = std::strtod(s.c_str(), &end);
  if (end == s.c_str() || *end != '\0') raise(kTypeMismatch);
  if (errno == ERANGE && std::isinf(value)) raise(kOverflow);
  return value;
}

}  // namespace

VarType Variant::type() const {
  return std::visit(
      Overloaded{
          [](const std::monostate&) { return VarType::Empty; },
          [](const Null&) { return VarType::Null; },
          [](const Integer&) { return VarType::Integer; },
          [](const Long&) { return VarType::Long; },
          [](const Single&) { return VarType::Single; },
          [](const Double&) { return VarType::Double; },
          [](const Date&) { return VarType::Date; },
          [](const String&) { return VarType::String; },
          [](const bool&) { return VarType::Boolean; },
          [](const Byte&) { return VarType::Byte; },
          [](const ObjectRef&) { return VarType::Object; },
          [](const detail::DeepBox<Array<Variant>>&) { return array_type(VarType::Variant); },
          [](const Array<Byte>&) { return array_type(VarType::Byte); },
          [](const Array<Integer>&) { return array_type(VarType::Integer); },
          [](const Array<Long>&) { return array_type(VarType::Long); },
          [](const Array<Single>&) { return array_type(VarType::Single); },
          [](const Array<Double>&) { return array_type(VarType::Double); },
          [](const Array<String>&) { return array_type(VarType::String); },
          [](const detail::RecordValue&) { return VarType::UserDefinedType; },
      },
      value_);
}

bool Variant::is_array() const {
  return static_cast<int>(type()) >= static_cast<int>(VarType::Array);
}

bool Variant::is_numeric() const {
  switch (type()) {
    case VarType::Integer:
    case VarType::Long:
    case VarType::Single:
    case VarType::Double:
    case VarType::Byte:
    case VarType::Boolean:
    case VarType::Date:
      return true;
    default:
      return false;
  }
}

std::u16string_view Variant::record_type_name() const {
  if (const auto* rec = std::get_if<detail::RecordValue>(&value_)) return rec->get().type_name();
  return {};
}

String Variant::to_string() const {
  return std::visit(
      Overloaded{
          [](const std::monostate&) -> String { return {}; },
          [](const Null&) -> String { raise(kInvalidUseOfNull); },
          [](const Integer& v) -> String { return format_number(v, 15); },
          [](const Long& v) -> String { return format_number(v, 15); },
          [](const Single& v) -> String { return format_number(static_cast<Double>(v), 7); },
          [](const Double& v) -> String { return format_number(v, 15); },
          [](const Date& v) -> String { return format_date(v); },
          [](const String& v) -> String { return v; },
          [](const bool& v) -> String { return v ? u"True" : u"False"; },
          [](const Byte& v) -> String { return format_number(v, 15); },
          [](const auto&) -> String { raise(kTypeMismatch); },
      },
      value_);
}

Double Variant::to_double() const {
  return std::visit(Overloaded{
                        [](const std::monostate&) -> Double { return 0.0; },
                        [](const Null&) -> Double { raise(kInvalidUseOfNull); },
                        [](const Integer& v) -> Double { return v; },
                        [](const Long& v) -> Double { return v; },
                        [](const Single& v) -> Double { return static_cast<Double>(v); },
                        [](const Double& v) -> Double { return v; },
                        [](const Date& v) -> Double { return v.days; },
                        [](const String& v) -> Double { return parse_number(v); },
                        [](const bool& v) -> Double { return v ? -1.0 : 0.0; },
                        [](const Byte& v) -> Double { return v; },
                        [](const auto&) -> Double { raise(kTypeMismatch); },
                    },
                    value_);
}

Long Variant::to_long() const {
  const double value = to_double();
  if (std::isnan(value)) raise(kOverflow);
  const double rounded = std::nearbyint(value);  // default mode: half to even
  if (rounded < static_cast<double>(std::numeric_limits<Long>::min()) ||
      rounded > static_cast<double>(std::numeric_limits<Long>::max())) {
    raise(kOverflow);
  }
  return static_cast<Long>(rounded);
}

bool operator==(const Variant& a, const Variant& b) {
  if (a.value_.index() != b.value_.index()) return false;
  return std::visit(
      [&](const auto& x) -> bool {
        using T = std::decay_t<decltype(x)>;
        const auto& y = std::get<T>(b.value_);
        if constexpr (std::is_same_v<T, std::monostate>) {
          return true;
        } else if constexpr (std::is_same_v<T, detail::DeepBox<Array<Variant>>>) {
          return x.get() == y.get();
        } else if constexpr (std::is_same_v<T, detail::RecordValue>) {
          return x.get().equals(y.get());
        } else {
          return x == y;
        }
      },
      a.value_);
}

}  // namespace kvdata
