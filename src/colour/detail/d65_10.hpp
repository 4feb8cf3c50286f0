#pragma once
// The arithmetic of illuminant D65 with the 1964 10-degree observer at a
// 10 nm interval, shared by ILU_D6510 and the batch conversion so that both
// round at exactly the same points.
//
//   Single w = weight(1, 20);   // Y at band 20: 0.08854999, the stored weight
//   Single l = lab_l(ratio(y, 1), power(ratio(y, 1)));   // L* of a Y

#include <array>
#include <cmath>
#include <cstddef>

#include "kvdata/automation/error.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata::detail::d65_10 {

inline constexpr std::size_t kComponents = 3;
inline constexpr std::size_t kBands = 40;

// Weighting factors before division by 100, [component][band - 1]. The
// values are written as Singles: the table is held in single precision.
inline constexpr std::array<std::array<Single, kBands>, kComponents> kTable = {{
    // X
    {0.000f, 0.000f, 0.000f, 0.008f, 0.137f, 0.676f, 1.603f, 2.451f, 3.418f, 3.699f,
     3.064f, 1.933f, 0.802f, 0.156f, 0.039f, 0.347f, 1.070f, 2.170f, 3.397f, 4.732f,
     6.070f, 7.311f, 8.291f, 8.634f, 8.672f, 7.930f, 6.446f, 4.669f, 3.095f, 1.859f,
     1.056f, 0.570f, 0.274f, 0.121f, 0.058f, 0.028f, 0.012f, 0.006f, 0.003f, 0.002f},
    // Y
    {0.000f, 0.000f, 0.000f, 0.001f, 0.014f, 0.069f, 0.168f, 0.300f, 0.554f, 0.890f,
     1.290f, 1.838f, 2.520f, 3.226f, 4.320f, 5.621f, 6.907f, 8.059f, 8.668f, 8.855f,
     8.581f, 7.951f, 7.106f, 6.004f, 5.079f, 4.065f, 2.999f, 2.042f, 1.290f, 0.746f,
     0.417f, 0.223f, 0.107f, 0.047f, 0.023f, 0.011f, 0.005f, 0.002f, 0.001f, 0.001f},
    // Z (band 3 is negative)
    {0.000f,  0.000f,  -0.002f, 0.033f, 0.612f, 3.110f, 7.627f, 12.095f, 17.537f, 19.888f,
     17.695f, 13.000f, 7.699f,  3.938f, 2.046f, 1.049f, 0.544f, 0.278f,  0.122f,  0.035f,
     0.001f,  0.000f,  0.000f,  0.000f, 0.000f, 0.000f, 0.000f, 0.000f,  0.000f,  0.000f,
     0.000f,  0.000f,  0.000f,  0.000f, 0.000f, 0.000f, 0.000f, 0.000f,  0.000f,  0.000f},
}};

// XYZ of the perfect white diffuser; not derived from the table.
inline constexpr std::array<Single, kComponents> kWhitePoint = {94.811f, 100.0f, 107.304f};

// Ratios above this take the cube-root branch; equal or below, the linear one.
inline constexpr Single kThreshold = 0.008856f;
// One third as the Single 0.33333331 (bit pattern 3EAAAAAA).
inline constexpr Single kExponent = 0.33333331f;
inline constexpr Double kLinearL = 903.3;
inline constexpr Double kLinearSlope = 7.787;
inline constexpr Double kLinearOffset = 16.0 / 116.0;

// A stored weight: the Single table value divided by 100 in double
// precision, rounded to Single. `band` is 1..40.
constexpr Single weight(std::size_t component, std::size_t band) {
  return static_cast<Single>(static_cast<Double>(kTable[component][band - 1]) / 100.0);
}

// One step of the running sum: the product and the addition in double, the
// sum rounded back to Single. The product of two Singles is exact in double.
inline Single accumulate(Single sum, Single w, Single r) {
  return static_cast<Single>(static_cast<Double>(sum) +
                             static_cast<Double>(w) * static_cast<Double>(r));
}

// Negative sums become 0.
inline Single clamp_sum(Single sum) {
  return sum < 0.0f ? 0.0f : sum;
}

// A component's ratio to the white point, rounded to Single.
inline Single ratio(Single value, std::size_t component) {
  return static_cast<Single>(static_cast<Double>(value) /
                             static_cast<Double>(kWhitePoint[component]));
}

inline bool above_threshold(Single r) {
  return r > kThreshold;
}

// ratio ^ 0.33333331 in double precision (meaningful above the threshold).
inline Double power(Single r) {
  return std::pow(static_cast<Double>(r), static_cast<Double>(kExponent));
}

// The linear branch, taken at or below the threshold.
inline Single linear_l(Single r) {
  return static_cast<Single>(kLinearL * static_cast<Double>(r));
}
inline Single linear_f(Single r) {
  return static_cast<Single>(kLinearSlope * static_cast<Double>(r) + kLinearOffset);
}

// L* from the ratio of Y and, above the threshold, its power.
inline Single lab_l(Single r, Double p) {
  return above_threshold(r) ? static_cast<Single>(116.0 * p - 16.0) : linear_l(r);
}

// f of one component from its ratio and, above the threshold, its power.
inline Single lab_f(Single r, Double p) {
  return above_threshold(r) ? static_cast<Single>(p) : linear_f(r);
}

inline Single lab_a(Single f0, Single f1) {
  return static_cast<Single>(500.0 * (static_cast<Double>(f0) - static_cast<Double>(f1)));
}

inline Single lab_b(Single f1, Single f2) {
  return static_cast<Single>(200.0 * (static_cast<Double>(f1) - static_cast<Double>(f2)));
}

// A Single result that overflowed or is not a number is a floating-point
// fault: error 6.
inline Single checked(Single value) {
  if (!std::isfinite(value)) raise(kOverflow);
  return value;
}

}  // namespace kvdata::detail::d65_10
