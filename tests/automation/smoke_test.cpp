#include <gtest/gtest.h>

#include "kvdata/kvdata.hpp"

TEST(Smoke, Builds) {
  kvdata::Variant v = kvdata::Long{5};
  EXPECT_EQ(v.to_string(), u"5");
  kvdata::tOVProfile p;
  p.ProfileData = kvdata::tOVProfileDataV1{};
  EXPECT_EQ(p.ProfileData.record_type_name(), u"tOVProfileDataV1");
  kvdata::tOVProfile q = p;
  EXPECT_EQ(p, q);
}
