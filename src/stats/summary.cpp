#include "kvdata/stats/summary.hpp"

#include <algorithm>
#include <cmath>
#include <limits>
#include <vector>

namespace kvdata {
namespace {

// The value at rank p * (n - 1) of `v` (numbers only, in any order; the
// order is changed), between the two nearest ranks.
Double percentile(std::vector<Double>& v, Double p) {
  const Double rank = p * static_cast<Double>(v.size() - 1);
  const auto k = static_cast<std::size_t>(rank);
  const auto at = v.begin() + static_cast<std::ptrdiff_t>(k);
  std::nth_element(v.begin(), at, v.end());
  const Double low = *at;
  if (k + 1 == v.size()) return low;
  // Everything after the k-th is at least as large: the next rank is its least.
  const Double high = *std::min_element(at + 1, v.end());
  return low + (rank - static_cast<Double>(k)) * (high - low);
}

}  // namespace

Summary summarise(std::span<const Single> values) {
  Summary s;
  s.max_index = values.size();
  std::vector<Double> numbers;
  numbers.reserve(values.size());
  Double sum = 0;
  for (std::size_t i = 0; i < values.size(); ++i) {
    const Single v = values[i];
    if (std::isnan(v)) continue;
    numbers.push_back(static_cast<Double>(v));
    sum += static_cast<Double>(v);
    if (s.max_index == values.size() || v > values[s.max_index]) s.max_index = i;
  }
  s.count = numbers.size();
  if (s.count == 0) {
    s.mean = s.median = s.p95 = s.max = std::numeric_limits<Double>::quiet_NaN();
    return s;
  }
  s.mean = sum / static_cast<Double>(s.count);
  s.max = static_cast<Double>(values[s.max_index]);
  s.median = percentile(numbers, 0.5);
  s.p95 = percentile(numbers, 0.95);
  return s;
}

}  // namespace kvdata
