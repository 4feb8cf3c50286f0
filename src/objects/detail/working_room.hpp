#pragma once
// The sizing rule of the object writers that reserve working room before
// they write (profile, test run): the stream is set to run from index 0 to
// Position + room, the field writers grow it further when an encoding needs
// more, and at the end it is cut to run from 0 to the final Position.
//
//   const auto end = kvdata::detail::working_end(pos, 2000);   // nothing: refuse, change nothing
//   kvdata::detail::set_stream_end(bytes, *end);

#include <optional>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {

// The index `room` past `position`, or nothing when `position` is negative
// or the index would pass the Long range. `room` is not negative.
inline std::optional<Long> working_end(Long position, Long room) {
  if (position < 0 || position > kLongMax - room) return std::nullopt;
  return position + room;
}

// Sets the stream to run from index 0 to `upper`, keeping the elements whose
// indices stay inside; a longer stream is cut, a shorter one lengthened with
// zeros, and a stream that was never given bounds is created. Raises error 7
// when memory runs out and error 9 for a two-dimensional array, changing
// nothing in either case.
inline void set_stream_end(ByteArray& stream, Long upper) {
  stream.redim_preserve(0, upper);
}

}  // namespace kvdata::detail
