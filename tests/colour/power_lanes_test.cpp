// The batch conversion's power of the ratios must round exactly as std::pow
// does. These tests walk the Singles above the threshold; the full walk over
// all 1.13e9 of them is the disabled test (run it in an optimised build with
// --gtest_also_run_disabled_tests; it takes under a minute).
#include "colour/detail/power_lanes.hpp"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstddef>
#include <cstdint>

namespace kvdata::detail::d65_10 {
namespace {

struct Walk {
  std::uint64_t checked = 0;
  std::uint64_t redone = 0;
  std::uint64_t wrong = 0;
  double worst = 0.0;
};

// Walks the Singles first, first + stride, ... up to `last`, sixteen at a
// time, comparing with std::pow.
Walk walk(std::uint32_t first, std::uint32_t last, std::uint32_t stride) {
  Walk w;
  SingleLanes r, f, l;
  DoubleLanes p;
  for (std::uint64_t u = first; u <= last;) {
    std::size_t n = 0;
    for (; n < kLanes && u <= last; ++n, u += stride) {
      r[n] = std::bit_cast<Single>(static_cast<std::uint32_t>(u));
    }
    for (std::size_t i = n; i < kLanes; ++i) r[i] = 1.0f;
    w.redone += static_cast<std::uint64_t>(exact_power_lanes(r, f, l));
    estimate_power_lanes(r, p);
    for (std::size_t i = 0; i < n; ++i) {
      ++w.checked;
      const Double e = power(r[i]);
      w.worst = std::fmax(w.worst, std::fabs(p[i] - e) / e);
      if (f[i] != lab_f(r[i], e) || l[i] != lab_l(r[i], e)) ++w.wrong;
    }
  }
  return w;
}

constexpr std::uint32_t kFirst = 0x3C1118C3u;  // the Single after 0.008856
constexpr std::uint32_t kLast = 0x7F7FFFFFu;   // the largest Single

TEST(PowerLanes, MatchesStdPowAcrossTheRange) {
  ASSERT_EQ(std::bit_cast<std::uint32_t>(kThreshold) + 1, kFirst);
  // The ends of the range one by one, and a stride through all of it.
  for (const Walk& w : {walk(kFirst, kFirst + 200000, 1), walk(kLast - 200000, kLast, 1),
                        walk(kFirst, kLast, 4099)}) {
    EXPECT_EQ(w.wrong, 0u);
    // The estimate must be good enough for nearly every lane to be settled
    // without std::pow.
    EXPECT_LT(w.worst, kSlack / 64);
    EXPECT_LT(w.redone, w.checked / 1000 + 16);
  }
}

TEST(PowerLanes, LanesAtOrBelowTheThresholdAreLeftToTheLinearBranch) {
  SingleLanes r, f, l;
  r.fill(0.5f);
  r[0] = kThreshold;
  r[1] = -3.0f;
  r[2] = std::bit_cast<Single>(0x7FC00000u);  // NaN
  r[3] = std::bit_cast<Single>(0x7F800000u);  // infinity
  r[4] = 0.0f;
  EXPECT_EQ(exact_power_lanes(r, f, l), 0);
  for (std::size_t i = 0; i < 5; ++i) EXPECT_TRUE(std::isfinite(f[i])) << i;
  EXPECT_EQ(f[5], lab_f(0.5f, power(0.5f)));
}

TEST(PowerLanes, DISABLED_MatchesStdPowForEverySingleAboveTheThreshold) {
  const Walk w = walk(kFirst, kLast, 1);
  EXPECT_EQ(w.checked, std::uint64_t{kLast - kFirst + 1});
  EXPECT_EQ(w.wrong, 0u);
  EXPECT_LT(w.worst, kSlack / 64);
}

}  // namespace
}  // namespace kvdata::detail::d65_10
