#pragma once
// The working room of the object writers that size their stream before they
// write (profile, test run): the stream is set to run from index 0 to
// Position + room, the field writers grow it further when an encoding needs
// more, and at the end it is cut to run from 0 to the final Position.
//
//   const auto end = kvdata::detail::working_end(pos, 2000);   // nothing: refuse, change nothing
//   kvdata::detail::resize_stream(bytes, *end);

#include <optional>

#include "kvdata/automation/types.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {

// The index `room` past `position`, or nothing when `position` is negative
// or the index would pass the Long range. `room` is not negative.
inline std::optional<Long> working_end(Long position, Long room) {
  if (position < 0 || position > kLongMax - room) return std::nullopt;
  return position + room;
}

}  // namespace kvdata::detail
