#pragma once
// ratio ^ 0.33333331 for many ratios at once, giving exactly the Singles
// that std::pow in double gives (f = Single(p) and L* = Single(116 p - 16)),
// in plain loops that the compiler vectorises. The batch conversion uses
// it; ILU_D6510 calls std::pow directly.
//
//   exact_power_lanes(ratio, f, l);   // lanes with ratio > 0.008856
//
// How: p = cbrt(x) * x^-d with d = 1/3 - 0.33333331 (about 2e-8). The cube
// root comes from a bit-pattern guess and two Halley steps, x^-d from
// 1 + t + t^2 / 2 with t = -d ln x. The estimate is within 8e-15 of
// the true power (relative), and std::pow within an ulp of that. Rounding
// is monotonic, so when the Singles worked out at p (1 - kSlack) and
// p (1 + kSlack) agree, std::pow's p rounds to the same Single. The few
// lanes where they differ (about 5 in 10^5) are redone with std::pow.

#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>

#include "colour/detail/d65_10.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata::detail::d65_10 {

inline constexpr std::size_t kLanes = 16;
using SingleLanes = std::array<Single, kLanes>;
using DoubleLanes = std::array<Double, kLanes>;
using FlagLanes = std::array<std::int32_t, kLanes>;

// Relative distance from the estimate within which std::pow's result is
// taken to lie: 2^-40 (9e-13), over a hundred times the estimate's worst
// error (7.9e-15, found by trying every Single above the threshold).
inline constexpr Double kSlack = 0x1p-40;

// p close to ratio ^ 0.33333331 for finite ratios above the threshold;
// other lanes are worked out from 1.0 instead.
inline void estimate_power_lanes(const SingleLanes& ratio, DoubleLanes& p) {
  constexpr Single kHighest = 3.4028235e38f;
  // 1/3 - 0.33333331, to about nine digits.
  constexpr Double kD = 1.0 / 3.0 - static_cast<Double>(kExponent);
  constexpr Double kLn2 = 0.6931471805599453;
  // A third of a Single's bit pattern plus this bias is within 3.3 % of the
  // cube root, for every normal Single.
  constexpr std::int32_t kCbrtBias = 709958130;
  constexpr std::int32_t kSqrt2Mantissa = 0x3504f3;  // of the Single nearest sqrt(2)

  // Chosen in a loop of its own, so that the one below is straight-line
  // code without branches, which the compiler vectorises.
  SingleLanes xs;
  for (std::size_t i = 0; i < kLanes; ++i) {
    const bool usable = (int{ratio[i] > kThreshold} & int{ratio[i] <= kHighest}) != 0;
    xs[i] = usable ? ratio[i] : 1.0f;
  }
  for (std::size_t i = 0; i < kLanes; ++i) {
    const Single x = xs[i];
    const auto u = std::bit_cast<std::int32_t>(x);
    const auto a = static_cast<Double>(x);

    // Cube root: the guess, then two Halley steps (error 3e-2, 2e-5, 7e-15).
    const std::int32_t guess =
        static_cast<std::int32_t>(static_cast<Single>(u) * (1.0f / 3.0f)) + kCbrtBias;
    Double y = static_cast<Double>(std::bit_cast<Single>(guess));
    const Double y3 = y * y * y;
    y = y * (y3 + 2.0 * a) / (2.0 * y3 + a);
    const Double z3 = y * y * y;
    y = y * (z3 + 2.0 * a) / (2.0 * z3 + a);

    // ln x = k ln 2 + ln m with m in [0.707, 1.415), taken from the bit
    // pattern (mantissas above that of sqrt(2) get exponent -1);
    // ln m = 2 atanh(s), s = (m - 1) / (m + 1), |s| < 0.172, to about 3e-8,
    // ample since only d ln x is needed.
    const std::int32_t mantissa = u & 0x007fffff;
    const std::int32_t high = mantissa > kSqrt2Mantissa ? 1 : 0;
    const auto m = static_cast<Double>(std::bit_cast<Single>(mantissa | ((127 - high) << 23)));
    const auto k = static_cast<Double>((u >> 23) - 127 + high);
    const Double s = (m - 1.0) / (m + 1.0);
    const Double s2 = s * s;
    const Double ln_m = 2.0 * s * (1.0 + s2 * (1.0 / 3.0 + s2 * (1.0 / 5.0 + s2 * (1.0 / 7.0))));
    const Double t = -kD * (k * kLn2 + ln_m);

    p[i] = y + y * (t + 0.5 * t * t);
  }
}

// For the lanes whose ratio is above the threshold (and finite), writes
// f = lab_f(ratio, p) and l = lab_l(ratio, p) with p the std::pow power,
// bit for bit. Other lanes get values that mean nothing. Returns the number
// of lanes that needed std::pow.
inline int exact_power_lanes(const SingleLanes& ratio, SingleLanes& f, SingleLanes& l) {
  alignas(64) DoubleLanes p;
  estimate_power_lanes(ratio, p);
  alignas(64) FlagLanes settled;
  for (std::size_t i = 0; i < kLanes; ++i) {
    const Double lo = p[i] - p[i] * kSlack;
    const Double hi = p[i] + p[i] * kSlack;
    const auto f_lo = static_cast<Single>(lo);
    const auto f_hi = static_cast<Single>(hi);
    const auto l_lo = static_cast<Single>(116.0 * lo - 16.0);
    const auto l_hi = static_cast<Single>(116.0 * hi - 16.0);
    f[i] = f_lo;
    l[i] = l_lo;
    settled[i] = static_cast<std::int32_t>(f_lo == f_hi) & static_cast<std::int32_t>(l_lo == l_hi);
  }
  int redone = 0;
  for (std::size_t i = 0; i < kLanes; ++i) {
    if (settled[i] != 0 || !above_threshold(ratio[i])) continue;
    const Double exact = power(ratio[i]);
    f[i] = lab_f(ratio[i], exact);
    l[i] = lab_l(ratio[i], exact);
    ++redone;
  }
  return redone;
}

}  // namespace kvdata::detail::d65_10
