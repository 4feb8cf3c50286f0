#pragma once
// Narrowing of a Double to a Single as the band setters store it: IEEE
// round-to-nearest-even, with magnitudes beyond the Single range becoming
// infinities instead of an undefined conversion.
//
//   kvdata::detail::narrow_to_single(1e300) == +infinity
//   kvdata::detail::narrow_to_single(0.1) == 0.1f

#include <cmath>
#include <limits>

#include "kvdata/automation/types.hpp"

namespace kvdata::detail {

inline Single narrow_to_single(Double value) {
  constexpr Double kLargest = static_cast<Double>(std::numeric_limits<Single>::max());
  // Largest Single plus half a unit in its last place: from here on the nearest
  // value is infinity (the tie goes there too, the largest Single being odd).
  constexpr Double kRoundsToInfinity = kLargest + 0x1p103;
  const Double magnitude = std::fabs(value);
  const Single sign = std::signbit(value) ? -1.0f : 1.0f;
  if (magnitude >= kRoundsToInfinity) return sign * std::numeric_limits<Single>::infinity();
  if (magnitude > kLargest) return sign * std::numeric_limits<Single>::max();
  return static_cast<Single>(value);  // in range, or NaN
}

}  // namespace kvdata::detail
