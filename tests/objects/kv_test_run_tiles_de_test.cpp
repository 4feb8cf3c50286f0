#include "kvdata/objects/kv_test_run_tiles_de.hpp"

#include <gtest/gtest.h>

#include "kvdata/kvdata.hpp"

namespace kvdata {
namespace {

TEST(KVTestRunTilesDE, IdentityOnlyObject) {
  auto obj = CreateObject(u"KVData.KVTestRunTilesDE");
  auto des = query<KVTestRunTilesDE>(obj);
  ASSERT_NE(des, nullptr);
  EXPECT_EQ(query<IKVStream>(obj), nullptr);
  EXPECT_EQ(query<IKVSecurity>(obj), nullptr);

  EXPECT_EQ(des->ObjType(), u"TestRunTileDEs");
  EXPECT_EQ(des->Description(), u"Test Run Tiles Average DEs");
  EXPECT_EQ(des->ID().type(), VarType::Long);  // a Long 0, not Empty
  EXPECT_EQ(des->ID().get<Long>(), 0);
  EXPECT_TRUE(des->DateCreated().is_empty());

  String isn = u"SN-1";
  Date date{45000.5};
  EXPECT_FALSE(des->FetchAndCalculateDEs(isn, date));
  EXPECT_FALSE(des->FetchAndCalculateDEs(u"", Date{}));
  EXPECT_EQ(isn, u"SN-1");
  EXPECT_EQ(date, Date{45000.5});
  EXPECT_EQ(des->ID().get<Long>(), 0);

  auto db = query<IKVDBObject>(obj);
  ASSERT_NE(db, nullptr);
  EXPECT_FALSE(db->Retrieve(isn));
  EXPECT_FALSE(db->AddNew());
  EXPECT_EQ(isn, u"SN-1");
  EXPECT_EQ(db->ErrMsg(), u"");
}

}  // namespace
}  // namespace kvdata
