#include "wire/cursor.hpp"

#include <bit>
#include <cmath>
#include <cstdint>
#include <cstdio>

#include "json/dates.hpp"
#include "json/json.hpp"
#include "json/numbers.hpp"
#include "kvdata/automation/ansi.hpp"
#include "kvdata/automation/text.hpp"

namespace kvdata::cli {
namespace {

template <class U>
U little_endian(std::span<const Byte> bytes, std::size_t at) {
  U v = 0;
  for (std::size_t i = 0; i < sizeof(U); ++i) v |= static_cast<U>(U{bytes[at + i]} << (8 * i));
  return v;
}

std::string show_single(Single v) {
  if (std::isfinite(v)) return shortest_text(v);
  return single_to_json(v).get<std::string>();
}

std::string show_double(Double v) {
  if (std::isfinite(v)) return shortest_text(v);
  return double_to_json(v).get<std::string>();
}

}  // namespace

std::string show_text(const String& s) {
  if (s.empty()) return "\"\"";
  bool never_set = true;
  for (char16_t c : s) never_set = never_set && c == 0;
  if (never_set) return "never set (" + std::to_string(s.size()) + " x U+0000)";
  std::size_t end = s.size();
  while (end > 0 && s[end - 1] == u' ') --end;
  std::string shown = Json(to_utf8(s.substr(0, end))).dump();
  if (end < s.size()) shown += " + " + std::to_string(s.size() - end) + " blanks";
  return shown;
}

std::string show_colour(Long rgb) {
  if (rgb < 0 || rgb > 0xFFFFFF) return "";
  char buf[16];
  std::snprintf(buf, sizeof buf, "#%02X%02X%02X", static_cast<unsigned>(rgb & 0xFF),
                static_cast<unsigned>((rgb >> 8) & 0xFF),
                static_cast<unsigned>((rgb >> 16) & 0xFF));
  return buf;
}

Cursor::Cursor(std::span<const Byte> bytes, Walk& walk) : bytes_(bytes), walk_(walk) {}

void Cursor::fail(const std::string& field, const std::string& expected) {
  if (walk_.problem) return;
  walk_.problem = Problem{pos_, field, expected};
}

void Cursor::fail_at(std::size_t offset, const std::string& field, const std::string& expected) {
  if (walk_.problem) return;
  walk_.problem = Problem{offset, field, expected};
}

void Cursor::note(const std::string& name, const std::string& value) {
  if (ok()) walk_.rows.push_back(FieldRow{pos_, 0, name, value});
}

bool Cursor::room(const std::string& name, std::size_t width, const char* what) {
  if (!ok()) return false;
  if (width > left()) {
    fail(name, std::string(what) + ": " + std::to_string(width) + " bytes, but " +
                   (left() == 0 ? std::string("the stream ends here")
                                : "only " + std::to_string(left()) + " are left"));
    return false;
  }
  return true;
}

void Cursor::row(const std::string& name, std::size_t width, std::string value) {
  walk_.rows.push_back(FieldRow{pos_, width, name, std::move(value)});
  pos_ += width;
  walk_.end = pos_;
}

std::optional<Integer> Cursor::integer_field(const std::string& name) {
  if (!room(name, 2, "an Integer")) return std::nullopt;
  const auto v = std::bit_cast<Integer>(little_endian<std::uint16_t>(bytes_, pos_));
  row(name, 2, std::to_string(v));
  return v;
}

std::optional<Long> Cursor::long_field(const std::string& name) {
  if (!room(name, 4, "a Long")) return std::nullopt;
  const auto v = std::bit_cast<Long>(little_endian<std::uint32_t>(bytes_, pos_));
  row(name, 4, std::to_string(v));
  return v;
}

std::optional<Long> Cursor::colour_field(const std::string& name) {
  if (!room(name, 4, "a Long")) return std::nullopt;
  const auto v = std::bit_cast<Long>(little_endian<std::uint32_t>(bytes_, pos_));
  const std::string colour = show_colour(v);
  row(name, 4, std::to_string(v) + (colour.empty() ? "" : " (" + colour + ")"));
  return v;
}

std::optional<Single> Cursor::single_field(const std::string& name) {
  if (!room(name, 4, "a Single")) return std::nullopt;
  const auto v = std::bit_cast<Single>(little_endian<std::uint32_t>(bytes_, pos_));
  row(name, 4, show_single(v));
  return v;
}

std::optional<Double> Cursor::double_field(const std::string& name) {
  if (!room(name, 8, "a Double")) return std::nullopt;
  const auto v = std::bit_cast<Double>(little_endian<std::uint64_t>(bytes_, pos_));
  row(name, 8, show_double(v));
  return v;
}

std::optional<Date> Cursor::date_field(const std::string& name) {
  if (!room(name, 8, "a Date")) return std::nullopt;
  const Date d{std::bit_cast<Double>(little_endian<std::uint64_t>(bytes_, pos_))};
  std::string shown = show_double(d.days) + " days";
  if (auto iso = iso_text(d)) shown = *iso + " (" + shown + ")";
  row(name, 8, shown);
  return d;
}

std::optional<bool> Cursor::boolean_field(const std::string& name) {
  if (!room(name, 1, "a Boolean")) return std::nullopt;
  const Byte b = bytes_[pos_];
  std::string shown = b == 1 ? "True" : "False";
  if (b > 1) shown += " (byte " + std::to_string(b) + "; only 1 reads as True)";
  row(name, 1, shown);
  return b == 1;
}

std::optional<String> Cursor::string_field(const std::string& name) {
  if (!room(name, 4, "a String count (Long)")) return std::nullopt;
  const auto n = std::bit_cast<Long>(little_endian<std::uint32_t>(bytes_, pos_));
  if (n < 0) {
    fail(name, "a String count of 0 or more; found " + std::to_string(n));
    return std::nullopt;
  }
  const auto count = static_cast<std::size_t>(n);
  if (count > left() - 4) {
    fail(name, "a String count that fits: it says " + std::to_string(n) +
                   " bytes of text follow, but only " + std::to_string(left() - 4) + " are left");
    return std::nullopt;
  }
  String text = ansi::decode(bytes_.subspan(pos_ + 4, count));
  row(name, 4 + count, show_text(text));
  return text;
}

std::optional<String> Cursor::text_field(const std::string& name, std::size_t units) {
  const std::string what = "a text of " + std::to_string(units) + " UTF-16 code units";
  if (!room(name, units * 2, what.c_str())) return std::nullopt;
  String text(units, u'\0');
  for (std::size_t i = 0; i < units; ++i) {
    text[i] = static_cast<char16_t>(little_endian<std::uint16_t>(bytes_, pos_ + 2 * i));
  }
  row(name, units * 2, show_text(text));
  return text;
}

bool Cursor::spectrum(const std::string& name) {
  for (int band = 1; band <= 40; ++band) {
    std::string field = name;
    field += '(';
    field += std::to_string(band);
    field += ')';
    if (!single_field(field)) return false;
  }
  return true;
}

bool Cursor::filler(const std::string& name, std::size_t width, const std::string& value) {
  if (!room(name, width, "filler")) return false;
  row(name, width, value);
  return true;
}

bool Cursor::stamp(const std::string& name, Single expected, const std::string& what) {
  const std::size_t at = pos_;
  const auto v = single_field(name);
  if (!v) return false;
  if (std::bit_cast<std::uint32_t>(*v) != std::bit_cast<std::uint32_t>(expected)) {
    fail_at(at, name,
            what + " " + shortest_text(expected) + "; found " + show_single(*v) +
                ", the stamp of another library version or not a stream of this kind");
    return false;
  }
  return true;
}

}  // namespace kvdata::cli
