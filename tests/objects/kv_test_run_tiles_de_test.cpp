#include "kvdata/objects/kv_test_run_tiles_de.hpp"

#include <gtest/gtest.h>

#include "kvdata/kvdata.hpp"

namespace kvdata {
namespace {

TEST(KVTestRunTilesDE, CalculatesNothingAndKeepsItsArguments) {
  auto des = query<KVTestRunTilesDE>(CreateObject(u"KVData.KVTestRunTilesDE"));
  ASSERT_NE(des, nullptr);
  EXPECT_EQ(des->ID(), Variant(Long{0}));  // a Long 0, not Empty
  EXPECT_TRUE(des->DateCreated().is_empty());
  String isn = u"SN-1";
  Date date{45000.5};
  EXPECT_FALSE(des->FetchAndCalculateDEs(isn, date));
  EXPECT_FALSE(des->FetchAndCalculateDEs(u"", Date{}));
  EXPECT_EQ(isn, u"SN-1");
  EXPECT_EQ(date, Date{45000.5});
  EXPECT_EQ(des->ID(), Variant(Long{0}));
}

}  // namespace
}  // namespace kvdata
