#pragma once
// Fields of a fixed record kept as its byte image (the tolerance and the
// tolerance-set header): scalars little-endian and text of a fixed number of
// UTF-16 code units at named offsets. The offsets are constants of the
// record, so a field outside the image is a bug of ours, not of the caller.
//
//   std::array<kvdata::Byte, 748> image{};
//   kvdata::detail::set_field(image, 616, kvdata::Double{1.5});
//   kvdata::detail::get_field<kvdata::Double>(image, 616);   // 1.5

#include <cassert>
#include <cstddef>
#include <span>

#include "kvdata/automation/text.hpp"
#include "kvdata/automation/types.hpp"
#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {

template <WireScalar T>
T get_field(std::span<const Byte> image, std::size_t offset) {
  T value{};
  [[maybe_unused]] const bool inside = load_le(image, offset, value);
  assert(inside);
  return value;
}

template <WireScalar T>
void set_field(std::span<Byte> image, std::size_t offset, T value) {
  [[maybe_unused]] const bool inside = store_le(image, offset, value);
  assert(inside);
}

// The field's text without leading and trailing blanks (U+0000 units stay).
inline String get_text_field(std::span<const Byte> image, std::size_t offset, std::size_t units) {
  String raw;
  [[maybe_unused]] const bool inside = load_fixed_text(image, offset, units, raw);
  assert(inside);
  return trim_blanks(raw);
}

// The field's `units` code units as stored, blank padding and U+0000 units included.
inline String get_raw_text_field(std::span<const Byte> image, std::size_t offset,
                                 std::size_t units) {
  String raw;
  [[maybe_unused]] const bool inside = load_fixed_text(image, offset, units, raw);
  assert(inside);
  return raw;
}

// Stores the text cut to `units` code units or padded with blanks.
inline void set_text_field(std::span<Byte> image, std::size_t offset, std::size_t units,
                           std::u16string_view text) {
  [[maybe_unused]] const bool inside = store_fixed_text(image, offset, units, text);
  assert(inside);
}

}  // namespace kvdata::detail
