// The field codec on long runs of one type: a million values written one by
// one into an array that starts empty (the writers grow it value by value),
// the same writes into an array already sized for them, the reads back, and
// memcpy of the same bytes as the limit. All figures are bytes per second of
// encoded stream.

#include <benchmark/benchmark.h>

#include <cstddef>
#include <string>
#include <utility>
#include <vector>

#include "bench_support.hpp"
#include "kvdata/streams/field_codec.hpp"

namespace kvdata::bench {
namespace {

constexpr std::size_t kValues = 1'000'000;
// Strings are fewer: each carries a 4-byte count and a short text.
constexpr std::size_t kStrings = 200'000;

// One value in a run. Boxed so that a run of Booleans is a plain array of
// bool objects (the readers take bool&), not a packed std::vector<bool>.
template <class T>
struct Box {
  T v{};
  friend bool operator==(const Box&, const Box&) = default;
};

// Registers the four benchmarks of one type: `values` is the run, `bytes`
// its encoded size, `write` and `read` the codec operations.
template <class T, class Write, class Read>
void register_run(const std::string& type, std::vector<Box<T>> values, std::size_t bytes,
                  Write write, Read read) {
  const std::string base = "codec/" + type + "/";

  // Into an array that starts with no elements: every value grows it.
  benchmark::RegisterBenchmark((base + "write_unsized").c_str(), [=](benchmark::State& state) {
    for (auto _ : state) {
      ByteArray stream(0, -1);
      Long position = 0;
      for (const Box<T>& b : values) write(b.v, stream, position);
      benchmark::DoNotOptimize(stream.data());
      if (static_cast<std::size_t>(position) != bytes) state.SkipWithError("short write");
    }
    set_throughput(state, bytes, values.size());
  });

  // Into a new array made at its final size: the same allocation, no growth.
  benchmark::RegisterBenchmark((base + "write_presized").c_str(), [=](benchmark::State& state) {
    for (auto _ : state) {
      ByteArray stream(0, static_cast<Long>(bytes) - 1);
      Long position = 0;
      for (const Box<T>& b : values) write(b.v, stream, position);
      benchmark::DoNotOptimize(stream.data());
      if (static_cast<std::size_t>(position) != bytes) state.SkipWithError("short write");
    }
    set_throughput(state, bytes, values.size());
  });

  // Into one array, sized once and written again and again: the writes alone.
  benchmark::RegisterBenchmark((base + "write_reused").c_str(), [=](benchmark::State& state) {
    ByteArray stream(0, static_cast<Long>(bytes) - 1);
    for (auto _ : state) {
      Long position = 0;
      for (const Box<T>& b : values) write(b.v, stream, position);
      benchmark::DoNotOptimize(stream.data());
      if (static_cast<std::size_t>(position) != bytes) state.SkipWithError("short write");
    }
    set_throughput(state, bytes, values.size());
  });

  benchmark::RegisterBenchmark((base + "read").c_str(), [=](benchmark::State& state) {
    ByteArray stream(0, -1);
    Long position = 0;
    for (const Box<T>& b : values) write(b.v, stream, position);
    std::vector<Box<T>> back(values.size());
    for (auto _ : state) {
      position = 0;
      for (Box<T>& b : back) read(stream, position, b.v);
      benchmark::DoNotOptimize(back.data());
      if (static_cast<std::size_t>(position) != bytes) state.SkipWithError("short read");
    }
    if (back != values) state.SkipWithError("values did not come back");
    set_throughput(state, bytes, values.size());
  });

  register_memcpy(base + "memcpy", bytes);
}

// A run of `n` values made by `make`, registered with the fixed width `width`.
template <class T, class Make, class Write, class Read>
void register_fixed(const std::string& type, std::size_t width, Make make, Write write, Read read) {
  std::vector<Box<T>> values(kValues);
  for (Box<T>& b : values) b.v = make();
  register_run<T>(type, std::move(values), kValues * width, write, read);
}

int register_all() {
  Lcg rng;
  register_fixed<Integer>(
      "Integer", 2, [&] { return static_cast<Integer>(rng.next()); }, IntegerToArray,
      IntegerFromArray);
  register_fixed<Long>(
      "Long", 4, [&] { return static_cast<Long>(rng.next()); }, LongToArray, LongFromArray);
  register_fixed<Single>(
      "Single", 4, [&] { return rng.uniform(0.0f, 100.0f); }, SingleToArray, SingleFromArray);
  register_fixed<Date>(
      "Date", 8, [&] { return Date{45000.0 + static_cast<double>(rng.next()) / 65536.0}; },
      DateToArray, DateFromArray);
  register_fixed<bool>(
      "Boolean", 1, [&] { return (rng.next() & 1u) != 0; }, BooleanToArray, BooleanFromArray);

  // Texts of 0 to 31 characters, like names, serial numbers and comments.
  std::vector<Box<String>> texts(kStrings);
  std::size_t bytes = 0;
  for (Box<String>& b : texts) {
    const std::size_t length = rng.next() % 32;
    for (std::size_t k = 0; k < length; ++k)
      b.v.push_back(static_cast<char16_t>(u'A' + rng.next() % 26));
    bytes += 4 + b.v.size();
  }
  register_run<String>(
      "String", std::move(texts), bytes,
      [](const String& v, ByteArray& s, Long& p) { StringToArray(v, s, p); },
      [](const ByteArray& s, Long& p, String& v) { StringFromArray(s, p, v); });
  return 0;
}

const int registered = register_all();

}  // namespace
}  // namespace kvdata::bench
