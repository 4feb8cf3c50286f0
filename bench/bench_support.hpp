#pragma once
// Shared pieces of the benchmark suite: the memcpy limit that every byte
// benchmark is set against, and a deterministic source of test values.
//
//   register_memcpy("codec/Long/memcpy", 4'000'000);
//   Lcg rng;  float r = rng.uniform(0.0f, 100.0f);

#include <benchmark/benchmark.h>

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

namespace kvdata::bench {

// A small linear congruential generator: the same values on every run and
// every machine, so that figures of different runs measure the same work.
class Lcg {
 public:
  explicit Lcg(std::uint64_t seed = 0x5DEECE66Dull) : state_(seed) {}
  std::uint32_t next() {
    state_ = state_ * 6364136223846793005ull + 1442695040888963407ull;
    return static_cast<std::uint32_t>(state_ >> 33);
  }
  float uniform(float lo, float hi) {
    return lo + (hi - lo) * static_cast<float>(next() & 0xFFFFFF) / static_cast<float>(0xFFFFFF);
  }

 private:
  std::uint64_t state_;
};

// Copies `bytes` bytes from one buffer to another that both already exist:
// the physical limit for moving the same bytes that an encoder writes or a
// decoder reads. Reported as bytes per second like the codec figures.
inline void register_memcpy(const std::string& name, std::size_t bytes) {
  benchmark::RegisterBenchmark(name.c_str(), [bytes](benchmark::State& state) {
    std::vector<unsigned char> from(bytes);
    std::vector<unsigned char> to(bytes);
    for (std::size_t i = 0; i < bytes; ++i) from[i] = static_cast<unsigned char>(i * 131u);
    for (auto _ : state) {
      benchmark::DoNotOptimize(from.data());
      std::memcpy(to.data(), from.data(), bytes);
      benchmark::DoNotOptimize(to.data());
      benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) *
                            static_cast<std::int64_t>(bytes));
  });
}

// Sets bytes and items per second for a benchmark that moved `items` values
// taking `bytes` bytes per iteration.
inline void set_throughput(benchmark::State& state, std::size_t bytes, std::size_t items) {
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) *
                          static_cast<std::int64_t>(bytes));
  state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations()) *
                          static_cast<std::int64_t>(items));
}

}  // namespace kvdata::bench
