#pragma once
// Helpers shared by the objects' own StreamIn and StreamOut: the extent of an
// encoding at a Position, the resize rules of the writers, and the copying of
// a raw block between a byte stream and a buffer. Bounds and the array's lower
// bound are handled by the little-endian reader and writer underneath.
//
//   const kvdata::Long end = kvdata::detail::index_after(pos, 749);   // error 6 past the Long
//   range kvdata::detail::grow_stream(bytes, end);  bool ok = kvdata::detail::put_block(bytes, pos,
//   block);

#include <cstddef>
#include <span>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata::detail {

// The index `n` past `position`. Raises error 6 when it falls outside the Long range.
Long index_after(Long position, std::size_t n);

// Upper bound of a stream that a writer is about to resize. An array that was
// never given bounds counts as an empty one from index 0 (upper bound -1).
Long writer_upper_bound(const ByteArray& stream);

// Sets the stream to run from index 0 to `upper`, keeping the elements whose
// indices stay inside; a longer array is cut, a shorter one lengthened.
// Raises error 9 for an `upper` below -1 and error 7 when memory runs out.
void resize_stream(ByteArray& stream, Long upper);

// Resizes the stream to run from index 0 to `upper` only when it ends
// earlier; a stream that reaches `upper` already is left as it is.
void grow_stream(ByteArray& stream, Long upper);

// Copies `block` to the indices position, position + 1, ... and advances
// `position` past it. False, with the stream and `position` unchanged, when
// those indices do not all lie inside the stream or would pass the Long range.
[[nodiscard]] bool put_block(ByteArray& stream, Long& position, std::span<const Byte> block);

// Fills `block` from the indices position, position + 1, ... and advances
// `position` by one for each byte taken. False when the stream ends (or
// `position` lies outside it) before the block is full: `position` then stays
// advanced by the bytes taken, and `block` holds them followed by its
// earlier content. A block that would end past the Long range is refused
// before any byte is taken.
[[nodiscard]] bool take_block(const ByteArray& stream, Long& position, std::span<Byte> block);

}  // namespace kvdata::detail
