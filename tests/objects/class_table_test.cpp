#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <string_view>
#include <typeindex>
#include <typeinfo>

#include "kvdata/kvdata.hpp"
#include "support/error_number.hpp"

namespace kvdata {
namespace {

// Every class a client may create by name, with the class the name must give.
struct Creatable {
  std::u16string_view progid;
  std::type_index type;
};

const Creatable kCreatable[] = {
    {u"KVData.ILU_D6510", typeid(ILU_D6510)},
    {u"KVData.KVTile", typeid(KVTile)},
    {u"KVData.KVCalTile", typeid(KVCalTile)},
    {u"KVData.KVUser", typeid(KVUser)},
    {u"KVData.KVTolerance", typeid(KVTolerance)},
    {u"KVData.KVTolSet", typeid(KVTolSet)},
    {u"KVData.KVCalibration", typeid(KVCalibration)},
    {u"KVData.KVTestRunTilesDE", typeid(KVTestRunTilesDE)},
    {u"KVData.KVTileSet", typeid(KVTileSet)},
    {u"KVData.KVProfile", typeid(KVProfile)},
    {u"KVData.DBManager", typeid(DBManager)},
    {u"KVData.KVTestRun", typeid(KVTestRun)},
    {u"KVData.KVTestRunSpreadTestData", typeid(KVTestRunSpreadTestData)},
    {u"KVData.Streams", typeid(Streams)},
};

void ExpectCannotCreate(std::u16string_view progid) {
  EXPECT_EQ(testing::error_number([&] { (void)CreateObject(progid); }), kCannotCreateObject)
      << to_utf8(progid);
}

// The listed names are exactly these, each giving a new object of its own
// class, whatever the letter case.
TEST(ClassTable, EachListedNameGivesANewObjectOfItsOwnClass) {
  std::size_t listed = 0;
  for (const CreatableClass& c : CreatableClasses()) {
    SCOPED_TRACE(to_utf8(c.progid));
    ++listed;
    const auto* known = std::find_if(std::begin(kCreatable), std::end(kCreatable),
                                     [&](const Creatable& k) { return k.progid == c.progid; });
    ASSERT_NE(known, std::end(kCreatable));
    std::shared_ptr<Object> a;
    std::shared_ptr<Object> b;
    ASSERT_EQ(testing::error_number([&] {
                a = CreateObject(c.progid);
                b = CreateObject(to_upper(c.progid));
              }),
              0);
    ASSERT_NE(a, nullptr);
    ASSERT_NE(b, nullptr);
    EXPECT_NE(a, b);
    EXPECT_EQ(std::type_index(typeid(*a)), known->type);
    EXPECT_EQ(std::type_index(typeid(*b)), known->type);
  }
  EXPECT_EQ(listed, std::size(kCreatable));
}

// What a new object of each class answers: its interfaces, its identity
// (ObjType and Description; nullptr where it has no IKVObj), and that its
// persistence does nothing and its rights are all refused.
struct Identity {
  std::u16string_view progid;
  const char16_t* obj_type;
  const char16_t* description;
  bool stream;
  bool db;
  bool security;
};

const Identity kIdentities[] = {
    {u"KVData.KVTile", nullptr, nullptr, true, false, false},
    {u"KVData.KVUser", u"User", u"User", true, false, false},
    {u"KVData.KVProfile", u"Profile", u"Profile", true, false, false},
    {u"KVData.KVTolSet", u"TolSet", u"Tolerance Set", true, true, true},
    {u"KVData.KVTestRun", u"TestRun", u"Test Run", true, true, true},
    {u"KVData.KVTestRunTilesDE", u"TestRunTileDEs", u"Test Run Tiles Average DEs", false, true,
     false},
};

TEST(ClassTable, InterfacesIdentityAndInertPersistenceAndRights) {
  for (const Identity& c : kIdentities) {
    SCOPED_TRACE(to_utf8(c.progid));
    const auto obj = CreateObject(c.progid);
    const auto id = query<IKVObj>(obj);
    ASSERT_EQ(id != nullptr, c.obj_type != nullptr);
    if (id) {
      EXPECT_EQ(id->ObjType(), c.obj_type);
      EXPECT_EQ(id->Description(), c.description);
    }
    const auto stream = query<IKVStream>(obj);
    EXPECT_EQ(stream != nullptr, c.stream);
    EXPECT_EQ(query<IKVProfile>(obj) != nullptr, c.progid == u"KVData.KVProfile");
    const auto db = query<IKVDBObject>(obj);
    ASSERT_EQ(db != nullptr, c.db);
    if (db) {
      ByteArray before(0, -1);
      if (stream) {
        ASSERT_TRUE(stream->StreamOut(before));
      }
      String key = u"SN-1";
      const Variant date(Date{5.0});
      EXPECT_FALSE(db->Retrieve(key, &date));
      EXPECT_FALSE(db->AddNew());
      EXPECT_FALSE(db->Update());
      EXPECT_FALSE(db->Delete());
      EXPECT_EQ(key, u"SN-1");
      EXPECT_EQ(db->ErrMsg(), u"");
      ByteArray after(0, -1);
      if (stream) {
        ASSERT_TRUE(stream->StreamOut(after));
      }
      EXPECT_EQ(after, before);
    }
    const auto sec = query<IKVSecurity>(obj);
    ASSERT_EQ(sec != nullptr, c.security);
    if (sec) {
      EXPECT_EQ(sec->UserNumber(), 0);
      sec->UserNumber(42);
      EXPECT_EQ(sec->UserNumber(), 42);
      EXPECT_FALSE(sec->CanRead() || sec->CanAdd() || sec->CanUpdate() || sec->CanDelete());
    }
  }
}

TEST(ClassTable, TestRunTilesDECalculatesNothingAndKeepsItsArguments) {
  auto des = query<KVTestRunTilesDE>(CreateObject(u"KVData.KVTestRunTilesDE"));
  String isn = u"SN-1";
  Date date{45000.5};
  EXPECT_FALSE(des->FetchAndCalculateDEs(isn, date));
  EXPECT_EQ(isn, u"SN-1");
  EXPECT_EQ(date, Date{45000.5});
  EXPECT_EQ(des->ID(), Variant(Long{0}));  // a Long 0, not Empty
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
