#pragma once
// Reads a stream's fields one after another for the layout walks, checking
// before every field that it fits in the bytes left. Each value read becomes
// a row of the walk; the first field that cannot be read becomes its
// problem, and every later call does nothing and returns nothing.
//
//   Cursor c(bytes, walk);
//   auto stamp = c.single_field("stream version");
//   auto tsn = c.string_field("TS.TSN");      // 4-byte count, then Windows-1252 text

#include <cstddef>
#include <optional>
#include <span>
#include <string>

#include "kvdata/automation/types.hpp"
#include "wire/walk.hpp"

namespace kvdata::cli {

class Cursor {
 public:
  Cursor(std::span<const Byte> bytes, Walk& walk);

  std::size_t pos() const { return pos_; }
  std::size_t left() const { return bytes_.size() - pos_; }
  bool ok() const { return !walk_.problem.has_value(); }

  // Field-codec values (little-endian; the Boolean is one byte, only 1 is True).
  std::optional<Integer> integer_field(const std::string& name);
  std::optional<Long> long_field(const std::string& name);
  std::optional<Single> single_field(const std::string& name);
  std::optional<Double> double_field(const std::string& name);
  std::optional<Date> date_field(const std::string& name);
  std::optional<bool> boolean_field(const std::string& name);
  // A Long byte count, then that many Windows-1252 bytes. A negative count or
  // one that runs past the end is the problem, at the count.
  std::optional<String> string_field(const std::string& name);
  // A fixed-width text of `units` UTF-16LE code units.
  std::optional<String> text_field(const std::string& name, std::size_t units);
  // A Long shown with its display colour as well.
  std::optional<Long> colour_field(const std::string& name);
  // 40 Singles named name(1) .. name(40).
  bool spectrum(const std::string& name);
  // Bytes that carry no value (gaps, trailing bytes); `value` describes them.
  bool filler(const std::string& name, std::size_t width, const std::string& value);
  // A Single that must equal `expected`; otherwise the problem says what it is.
  bool stamp(const std::string& name, Single expected, const std::string& what);

  // Records the problem at the current offset and stops the walk.
  void fail(const std::string& field, const std::string& expected);
  // The same at an earlier offset, for a field already read whose value is wrong.
  void fail_at(std::size_t offset, const std::string& field, const std::string& expected);
  // Adds a note row of zero width (a count derived from the bytes, etc.).
  void note(const std::string& name, const std::string& value);

 private:
  bool room(const std::string& name, std::size_t width, const char* what);
  void row(const std::string& name, std::size_t width, std::string value);

  std::span<const Byte> bytes_;
  Walk& walk_;
  std::size_t pos_ = 0;
};

// Text shown for a decoded String: quoted with JSON escapes; trailing blank
// padding and never-set (all U+0000) fields are described instead of shown.
std::string show_text(const String& s);
// "#RRGGBB" of a ColorRGB value (red in the low byte); "" when not a colour.
std::string show_colour(Long rgb);

}  // namespace kvdata::cli
