#pragma once
// Fields of the fixed blocks that objects hold in exactly their stream layout
// (the tile block, the calibration block). Offsets are the layouts' named
// constants, so a field that does not lie inside its block is a bug of ours,
// not a caller's mistake.
//
//   std::array<kvdata::Byte, 264> block{};
//   kvdata::detail::block_set<kvdata::Long>(block, 100, 0xFF);   // FF 00 00 00 at 100

#include <cassert>
#include <cstddef>
#include <span>
#include <string_view>

#include "kvdata/automation/types.hpp"
#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {

template <WireScalar T>
T block_get(std::span<const Byte> block, std::size_t offset) {
  T value{};
  [[maybe_unused]] const bool inside = load_le(block, offset, value);
  assert(inside);
  return value;
}

template <WireScalar T>
void block_set(std::span<Byte> block, std::size_t offset, T value) {
  [[maybe_unused]] const bool inside = store_le(block, offset, value);
  assert(inside);
}

// The `units` raw code units at `offset`, padding and U+0000 units included.
inline String block_text(std::span<const Byte> block, std::size_t offset, std::size_t units) {
  String text;
  [[maybe_unused]] const bool inside = load_fixed_text(block, offset, units, text);
  assert(inside);
  return text;
}

// Stores `text` cut at `units` code units or padded with U+0020.
inline void block_set_text(std::span<Byte> block, std::size_t offset, std::size_t units,
                           std::u16string_view text) {
  [[maybe_unused]] const bool inside = store_fixed_text(block, offset, units, text);
  assert(inside);
}

}  // namespace kvdata::detail
