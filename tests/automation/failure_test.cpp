#include "automation/detail/failure.hpp"

#include <gtest/gtest.h>

#include <functional>
#include <new>
#include <stdexcept>
#include <system_error>

namespace kvdata {
namespace {

// What each kind of failure becomes at the boundary: the number handed on,
// and whether the raised Error itself is handed on.
TEST(FailureBoundary, EveryStandardFailureBecomesItsNumber) {
  struct Case {
    std::function<int()> body;
    Long number;
    bool error_object;
  };
  const Case cases[] = {
      {[]() -> int { raise(kSubscriptOutOfRange, u"KVData.Test"); }, kSubscriptOutOfRange, true},
      {[]() -> int { throw std::bad_alloc(); }, kOutOfMemory, false},
      {[]() -> int { throw std::length_error("vector"); }, kOutOfMemory, false},
      {[]() -> int { throw std::system_error(std::make_error_code(std::errc::io_error)); },
       kInternalError, false},
      {[]() -> int { throw std::runtime_error("from a caller's object"); }, kInternalError, false},
  };
  for (const Case& c : cases) {
    Long seen = 0;
    bool error = false;
    const int result = detail::on_failure(
        [&](Long number, const Error* e) {
          seen = number;
          error = e != nullptr && e->number() == number;
          return -1;
        },
        c.body);
    EXPECT_EQ(result, -1);
    EXPECT_EQ(seen, c.number);
    EXPECT_EQ(error, c.error_object) << c.number;
  }
  EXPECT_EQ(detail::on_failure([](Long, const Error*) { return -1; }, [] { return 4; }), 4);
  EXPECT_FALSE(detail::false_on_failure([]() -> bool { throw std::bad_alloc(); }));
}

}  // namespace
}  // namespace kvdata
