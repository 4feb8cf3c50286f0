#include <gtest/gtest.h>

#include "kvdata/kvdata.hpp"

TEST(Smoke, Builds) {
  kvdata::Variant v = kvdata::Long{5};
  EXPECT_EQ(v.to_string(), u"5");
}
