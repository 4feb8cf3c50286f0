// The spread-test object on 1000 samples of 40 points per tile: the whole
// test (initialise, add the white and the blue samples, calculate) and the
// calculation alone, next to a plain loop that computes the same mean,
// lowest, highest and spread over the same numbers held in one flat array
// (the arithmetic limit). Figures are samples per second.

#include <benchmark/benchmark.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "bench_support.hpp"
#include "kvdata/stats/kv_test_run_spread_test_data.hpp"

namespace kvdata::bench {
namespace {

constexpr std::size_t kSamples = 1000;  // per tile
constexpr Integer kPoints = 40;

// The samples of both tiles, as the Variants a caller hands in and flat.
struct SpreadData {
  std::vector<Variant> white;
  std::vector<Variant> blue;
  std::vector<Single> flat;  // white then blue, kPoints per sample
};

const SpreadData& data() {
  static const SpreadData d = [] {
    SpreadData out;
    Lcg rng(21);
    for (int tile = 0; tile < 2; ++tile) {
      const float base = tile == 0 ? 90.0f : 20.0f;
      for (std::size_t k = 0; k < kSamples; ++k) {
        Array<Single> sample(1, kPoints);
        for (Long i = 1; i <= kPoints; ++i) {
          sample(i) = base + rng.uniform(-0.5f, 0.5f);
          out.flat.push_back(sample(i));
        }
        (tile == 0 ? out.white : out.blue).emplace_back(std::move(sample));
      }
    }
    return out;
  }();
  return d;
}

void fill(KVTestRunSpreadTestData& test, const SpreadData& d) {
  const Integer points = kPoints;
  test.KVRR_Initialize(points);
  test.KVRR_SetCurrentTestToWhiteTile();
  for (const Variant& v : d.white) test.KVRR_AddSpectralData(v);
  test.KVRR_SetCurrentTestToBlueTile();
  for (const Variant& v : d.blue) test.KVRR_AddSpectralData(v);
}

void set_samples(benchmark::State& state) {
  state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations()) *
                          static_cast<std::int64_t>(2 * kSamples));
}

void BM_WholeTest(benchmark::State& state) {
  const SpreadData& d = data();
  const auto test = KVTestRunSpreadTestData::create();
  for (auto _ : state) {
    fill(*test, d);
    const Integer status = test->KVRR_CalculateSpreadTestData();
    if (status != 0) state.SkipWithError("calculation failed");
    benchmark::ClobberMemory();
  }
  set_samples(state);
}
BENCHMARK(BM_WholeTest)->Name("stats/spread_1000x40/add_and_calculate");

void BM_Calculate(benchmark::State& state) {
  const SpreadData& d = data();
  const auto test = KVTestRunSpreadTestData::create();
  fill(*test, d);
  for (auto _ : state) {
    const Integer status = test->KVRR_CalculateSpreadTestData();
    if (status != 0) state.SkipWithError("calculation failed");
    benchmark::ClobberMemory();
  }
  set_samples(state);
}
BENCHMARK(BM_Calculate)->Name("stats/spread_1000x40/calculate");

// The same four results from the flat numbers, with the object's rounding
// (sums rounded to Single after every sample) but none of its containers.
void BM_PlainLoop(benchmark::State& state) {
  const SpreadData& d = data();
  for (auto _ : state) {
    for (int tile = 0; tile < 2; ++tile) {
      const Single* samples = d.flat.data() + static_cast<std::size_t>(tile) * kSamples * kPoints;
      std::array<Single, kPoints> sum{};
      std::array<Single, kPoints> low;
      std::array<Single, kPoints> high;
      low.fill(9999.0f);
      high.fill(-9999.0f);
      for (std::size_t k = 0; k < kSamples; ++k) {
        const Single* s = samples + k * kPoints;
        for (std::size_t i = 0; i < kPoints; ++i) {
          sum[i] = static_cast<Single>(static_cast<Double>(sum[i]) + static_cast<Double>(s[i]));
          low[i] = low[i] > s[i] ? s[i] : low[i];
          high[i] = high[i] < s[i] ? s[i] : high[i];
        }
      }
      std::array<Single, kPoints> spread;
      for (std::size_t i = 0; i < kPoints; ++i) {
        sum[i] = static_cast<Single>(static_cast<Double>(sum[i]) / static_cast<Double>(kSamples));
        spread[i] = high[i] - low[i];
      }
      benchmark::DoNotOptimize(sum);
      benchmark::DoNotOptimize(spread);
    }
  }
  set_samples(state);
}
BENCHMARK(BM_PlainLoop)->Name("stats/spread_1000x40/plain_loop");

}  // namespace
}  // namespace kvdata::bench
