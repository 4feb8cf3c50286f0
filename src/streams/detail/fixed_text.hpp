#pragma once
// Fixed-width UTF-16 text fields inside raw blocks (user, organisation,
// tolerance, tile and calibration blocks). A field holds exactly `units` code
// units, little-endian. Storing cuts the text at that width or pads it with
// U+0020; reading returns the raw units (a field never set holds U+0000,
// which is kept); removing the padding is a separate step (trim_blanks).
//
//   bool ok = kvdata::detail::store_fixed_text(block, 0, 8, u"SMITH");   // "SMITH   "
//   kvdata::String id;  ok = kvdata::detail::load_fixed_text(block, 0, 8, id);

#include <cstddef>
#include <span>
#include <string_view>

#include "kvdata/automation/types.hpp"

namespace kvdata::detail {

// Width in bytes of a field of `units` code units.
constexpr std::size_t text_bytes(std::size_t units) {
  return 2 * units;
}

// Stores `text` into the `units` code units at `offset`. False, with the
// buffer untouched, when the field does not lie inside the buffer.
[[nodiscard]] bool store_fixed_text(std::span<Byte> out, std::size_t offset, std::size_t units,
                                    std::u16string_view text);

// Reads the `units` raw code units at `offset` into `text`. False, with
// `text` untouched, when the field does not lie inside the buffer.
[[nodiscard]] bool load_fixed_text(std::span<const Byte> in, std::size_t offset, std::size_t units,
                                   String& text);

}  // namespace kvdata::detail
