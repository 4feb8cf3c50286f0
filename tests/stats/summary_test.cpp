#include "kvdata/stats/summary.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <vector>

namespace kvdata {
namespace {

TEST(Summary, FiguresOfASmallSetWithTheNaNsLeftOut) {
  const Single nan = std::nanf("");
  const struct {
    std::vector<Single> values;
    std::size_t count;
    Double mean, median, p95, max;
    std::size_t max_index;
  } cases[] = {
      // Sorted 1 1 2 3 4 5 6 9 9: median at rank 4, p95 at rank 7.6.
      {{3, nan, 1, 4, 1, 5, 9, 2, 6, 9}, 9, 40.0 / 9, 4, 9, 9, 6},
      // Sorted 1 2 3 10: median halfway between 2 and 3, p95 at rank 2.85.
      {{10, 2, 3, 1}, 4, 4, 2.5, 3 + 0.85 * 7, 10, 0},
      {{0.5f}, 1, 0.5, 0.5, 0.5, 0.5, 0},
  };
  for (const auto& c : cases) {
    const Summary s = summarise(c.values);
    EXPECT_EQ(s.count, c.count);
    EXPECT_DOUBLE_EQ(s.mean, c.mean);
    EXPECT_DOUBLE_EQ(s.median, c.median);
    EXPECT_NEAR(s.p95, c.p95, 1e-12);
    EXPECT_EQ(s.max, c.max);
    EXPECT_EQ(s.max_index, c.max_index);
  }
  const Summary none = summarise(std::vector<Single>{nan, nan});
  EXPECT_EQ(none.count, 0u);
  EXPECT_TRUE(std::isnan(none.mean) && std::isnan(none.median) && std::isnan(none.max));
  EXPECT_EQ(none.max_index, 2u);
}

}  // namespace
}  // namespace kvdata
