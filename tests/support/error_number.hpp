#pragma once
// Test helper: the number of the kvdata::Error that `f` raises, or 0 when it
// raises none.
//
//   EXPECT_EQ(kvdata::testing::error_number([&] { (void)a(41); }), kvdata::kSubscriptOutOfRange);

#include <utility>

#include "kvdata/automation/error.hpp"

namespace kvdata::testing {

template <class F>
Long error_number(F&& f) {
  try {
    std::forward<F>(f)();
  } catch (const Error& e) {
    return e.number();
  }
  return 0;
}

}  // namespace kvdata::testing
