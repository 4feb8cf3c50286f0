#pragma once
// The figures people quote for a set of colour differences: how many, their
// mean, median, 95th percentile and maximum, and which value is the maximum.
// Values that are not numbers (NaN) are left out of every figure.
//
//   std::vector<Single> dE = ...;
//   kvdata::Summary s = kvdata::summarise(dE);   // s.p95, s.max_index

#include <cstddef>
#include <span>

#include "kvdata/automation/types.hpp"

namespace kvdata {

struct Summary {
  std::size_t count = 0;  // values that are numbers
  // NaN when count is 0.
  Double mean = 0;
  Double median = 0;
  Double p95 = 0;
  Double max = 0;
  // Index in the input of the first value equal to the maximum; the input's
  // size when count is 0.
  std::size_t max_index = 0;
};

// Percentiles interpolate linearly between the two nearest ranks of the
// sorted values (rank p * (count - 1), counted from 0), so the median of an
// even count is the mean of the middle two.
Summary summarise(std::span<const Single> values);

}  // namespace kvdata
