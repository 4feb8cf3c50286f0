#pragma once
// Raw fixed blocks (tile, calibration) moved into and out of a byte stream at
// a running Position, byte for byte and without the field codec. The block is
// checked as a whole before a byte is copied.
//
//   if (!kvdata::detail::size_stream_to_end(bytes, pos, 264)) return false;
//   return kvdata::detail::write_block(bytes, pos, block);   // bounds now 0 .. pos

#include <cstddef>
#include <span>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata::detail {

// Copies the block.size() bytes at Position into `block` and moves Position
// past them. When the array ends first (or Position lies outside it), `block`
// is untouched, Position moves past the bytes that were there and the result
// is False. A Position that could not move past a byte read is left at the
// largest Long.
[[nodiscard]] bool read_block(const ByteArray& stream, Long& position, std::span<Byte> block);

// Gives the array bounds 0 .. position + n, keeping the elements that stay
// inside them (a longer array is shortened; an array without bounds is
// created). False, with the array unchanged, for a negative position, an end
// that would overflow a Long, or no memory.
[[nodiscard]] bool size_stream_to_end(ByteArray& stream, Long position, std::size_t n);

// Copies `block` to indices position .. position + block.size() - 1, which the
// array must already hold, and moves Position past it. False, with nothing
// written and Position unchanged, otherwise.
[[nodiscard]] bool write_block(ByteArray& stream, Long& position, std::span<const Byte> block);

}  // namespace kvdata::detail
