#pragma once
// Spread tests filled with pseudo-random samples of every element type a
// caller may hand in (Single, Double, Long, Integer, Byte and Variant arrays),
// made alike on every platform, and the bits of every table they produce.

#include <bit>
#include <cstdint>
#include <vector>

#include "kvdata/automation/error.hpp"
#include "kvdata/stats/kv_test_run_spread_test_data.hpp"

namespace kvdata::testing {

class SpreadSamples {
 public:
  explicit SpreadSamples(std::uint64_t seed) : state_(seed) {}

  // One sample of `points` values near `level`, as element type `type` (0 to 5).
  Variant sample(Long points, double level, int type) {
    auto fill = [&](auto a) {
      for (Long i = 1; i <= points; ++i) {
        using T = std::remove_cvref_t<decltype(a(i))>;
        const double v = level + 40 * (next() - 0.5);
        if constexpr (std::is_same_v<T, Variant>) {
          a(i) = (i % 2 == 0) ? Variant(static_cast<Single>(v)) : Variant(static_cast<Long>(v));
        } else {
          a(i) = static_cast<T>(v);
        }
      }
      return Variant(a);
    };
    switch (type) {
      case 0:
        return fill(Array<Single>(1, points));
      case 1:
        return fill(Array<Double>(1, points));
      case 2:
        return fill(Array<Long>(1, points));
      case 3:
        return fill(Array<Integer>(1, points));
      case 4:
        return fill(Array<Byte>(1, points));
      default:
        return fill(Array<Variant>(1, points));
    }
  }

  // A uniform number in [0, 1), the same sequence everywhere.
  double next() {
    state_ = state_ * 6364136223846793005u + 1442695040888963407u;
    return static_cast<double>(state_ >> 11) / 9007199254740992.0;
  }

 private:
  std::uint64_t state_;
};

// The status and the bits of the average, lowest, highest and spread tables
// after calculating test `t` of a run of tests: white and blue samples, most
// Singles, the rest of every other type (from test 6 on, of the numeric
// types only); in test 3 a String sample in the white tile stops the
// calculation with error 13 part way, in test 8 a Double beyond the Single
// range in the blue tile with error 6.
inline std::vector<std::uint32_t> spread_results(int t) {
  SpreadSamples rng(static_cast<std::uint64_t>(1000 + t));
  const Long points = 1 + static_cast<Long>(rng.next() * 45);
  const int samples = 1 + static_cast<int>(rng.next() * 300);
  auto test = KVTestRunSpreadTestData::create();
  test->KVRR_Initialize(static_cast<Integer>(points));
  for (int tile = 0; tile < 2; ++tile) {
    if (tile == 0) test->KVRR_SetCurrentTestToWhiteTile();
    if (tile == 1) test->KVRR_SetCurrentTestToBlueTile();
    for (int k = 0; k < samples; ++k) {
      // From test 6 on, only arrays of numbers (the calculation's one pass).
      const int types = t >= 6 ? 5 : 6;
      const int type = rng.next() < 0.7 ? 0 : static_cast<int>(rng.next() * types);
      test->KVRR_AddSpectralData(rng.sample(points, tile == 0 ? 90 : 30, type));
      if (t == 8 && tile == 1 && k == samples / 3) {
        Array<Double> huge(1, points);
        for (Long i = 1; i <= points; ++i) huge(i) = i == points ? 1e39 : 25.0;
        test->KVRR_AddSpectralData(Variant(huge));
      }
      if (t == 3 && tile == 0 && k == samples / 2) {
        Array<String> text(1, points);
        for (Long i = 1; i <= points; ++i) text(i) = i == points / 2 + 1 ? u"x" : u"5";
        test->KVRR_AddSpectralData(Variant(text));
      }
    }
  }
  std::vector<std::uint32_t> bits;
  try {
    bits.push_back(static_cast<std::uint32_t>(test->KVRR_CalculateSpreadTestData()));
  } catch (const Error& e) {
    bits.push_back(static_cast<std::uint32_t>(e.number()));
  }
  for (const Variant& table : {test->KVRR_GetAverageWL(), test->KVRR_GetLowestWL(),
                               test->KVRR_GetHighestWL(), test->KVRR_GetSpreadOfEachWL()}) {
    for (const Single v : table.get<Array<Single>>())
      bits.push_back(std::bit_cast<std::uint32_t>(v));
  }
  return bits;
}

}  // namespace kvdata::testing
