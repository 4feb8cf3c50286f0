#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <string_view>
#include <vector>

#include "kvdata/kvdata.hpp"
#include "support/error_number.hpp"

namespace kvdata {
namespace {

// Every class a client may create by name.
constexpr std::u16string_view kCreatable[] = {
    u"KVData.ILU_D6510",
    u"KVData.KVTile",
    u"KVData.KVCalTile",
    u"KVData.KVUser",
    u"KVData.KVTolerance",
    u"KVData.KVTolSet",
    u"KVData.KVCalibration",
    u"KVData.KVTestRunTilesDE",
    u"KVData.KVTileSet",
    u"KVData.KVProfile",
    u"KVData.DBManager",
    u"KVData.KVTestRun",
    u"KVData.KVTestRunSpreadTestData",
    u"KVData.Streams",
};

void ExpectCannotCreate(std::u16string_view progid) {
  EXPECT_EQ(testing::error_number([&] { (void)CreateObject(progid); }), kCannotCreateObject)
      << to_utf8(progid);
}

TEST(ClassTable, ListsExactlyTheCreatableClasses) {
  std::vector<String> listed;
  for (const CreatableClass& c : CreatableClasses()) listed.emplace_back(c.progid);
  std::vector<String> expected(std::begin(kCreatable), std::end(kCreatable));
  std::sort(listed.begin(), listed.end());
  std::sort(expected.begin(), expected.end());
  EXPECT_EQ(listed, expected);
}

TEST(ClassTable, EveryCreatableClassGivesANewObject) {
  for (std::u16string_view progid : kCreatable) {
    SCOPED_TRACE(to_utf8(progid));
    std::shared_ptr<Object> a;
    std::shared_ptr<Object> b;
    try {
      a = CreateObject(progid);
      b = CreateObject(to_upper(progid));
    } catch (const Error& e) {
      ADD_FAILURE() << "error " << e.number();
      continue;
    }
    ASSERT_NE(a, nullptr);
    ASSERT_NE(b, nullptr);
    EXPECT_NE(a, b);
  }
}

TEST(ClassTable, NamesSelectTheirOwnClass) {
  // Classes with an identity report the type word of their class.
  const struct {
    std::u16string_view progid;
    std::u16string_view type_word;
  } identified[] = {
      {u"KVData.KVUser", u"User"},
      {u"KVData.KVTolSet", u"TolSet"},
      {u"KVData.KVTileSet", u"TileSet"},
      {u"KVData.KVCalibration", u"Calibration"},
      {u"KVData.KVProfile", u"Profile"},
      {u"KVData.KVTestRun", u"TestRun"},
      {u"KVData.KVTestRunTilesDE", u"TestRunTileDEs"},
  };
  for (const auto& entry : identified) {
    SCOPED_TRACE(to_utf8(entry.progid));
    std::shared_ptr<IKVObj> obj;
    try {
      obj = query<IKVObj>(CreateObject(entry.progid));
    } catch (const Error& e) {
      ADD_FAILURE() << "error " << e.number();
      continue;
    }
    ASSERT_NE(obj, nullptr);
    EXPECT_EQ(obj->ObjType(), entry.type_word);
  }

  auto manager = CreateObject(u"KVData.DBManager");
  EXPECT_NE(std::dynamic_pointer_cast<DBManager>(manager), nullptr);
  EXPECT_NE(query<IKVObjCreator>(manager), nullptr);
  try {
    auto tolerance = CreateObject(u"KVData.KVTolerance");
    EXPECT_NE(query<IKVTolerance>(tolerance), nullptr);
    EXPECT_EQ(query<IKVStream>(tolerance)->StreamLen(), 748);
  } catch (const Error& e) {
    ADD_FAILURE() << "KVData.KVTolerance: error " << e.number();
  }
}

TEST(ClassTable, InterfacesFacadesAndOtherNamesCannotBeCreated) {
  for (std::u16string_view name :
       {u"IKVObj",         u"IKVStream",  u"IKVDBObject",  u"IKVSecurity",   u"IKVObjCreator",
        u"IKVTolerance",   u"IKVTolSet",  u"IKVTile",      u"IKVCalTile",    u"IKVTileSet",
        u"IKVCalibration", u"IKVProfile", u"IIlluminant",  u"Organizations", u"Stations",
        u"USers",          u"ServerDB",   u"CalStandards", u"TestRun1",      u"TestRun1Iterator",
        u"Profiles",       u"_Streams"}) {
    ExpectCannotCreate(String(u"KVData.") + String(name));
  }
  for (std::u16string_view progid :
       {u"DBManager", u"KVData.", u"", u"KVData.DBManager ", u" KVData.DBManager",
        u"KVData..DBManager", u"KVDataDBManager", u"Other.DBManager", u"KVData.KVTolSets"}) {
    ExpectCannotCreate(progid);
  }
}

}  // namespace
}  // namespace kvdata
