// Replaces the global allocation functions of the stream test program so
// that tests can see the largest allocation a decoder made.

#include <gtest/gtest.h>

#include <atomic>
#include <cstdlib>
#include <new>

#include "streams/stream_test_support.hpp"

namespace {
std::atomic<std::size_t> largest{0};
}  // namespace

void* operator new(std::size_t n) {
  std::size_t seen = largest.load();
  while (n > seen && !largest.compare_exchange_weak(seen, n)) {
  }
  if (void* p = std::malloc(n == 0 ? 1 : n)) return p;
  throw std::bad_alloc();
}
void operator delete(void* p) noexcept {
  std::free(p);
}
void operator delete(void* p, std::size_t) noexcept {
  std::free(p);
}

namespace kvdata::testing {

void reset_largest_allocation() {
  largest = 0;
}
std::size_t largest_allocation() {
  return largest.load();
}

// The probe must see a decoder's allocations, or the tests built on it
// would pass without proving anything.
TEST(AllocationProbe, SeesTheAllocationsOfADecoder) {
  ByteArray stream = stream_of(Wire().str(std::string(5000, 'x')).bytes);
  String text;
  Long position = 0;
  reset_largest_allocation();
  StringFromArray(stream, position, text);
  EXPECT_EQ(text.size(), 5000u);
  EXPECT_GE(largest_allocation(), 5000u);
}

}  // namespace kvdata::testing
