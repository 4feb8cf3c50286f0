#include <gtest/gtest.h>

#include <memory>

#include "kvdata/kvdata.hpp"

namespace kvdata {
namespace {

TEST(DBManager, FacadesAreCreatedOncePerManager) {
  auto first = DBManager::create();
  auto second = DBManager::create();

  const auto check = [&](auto accessor) {
    auto a = ((*first).*accessor)();
    ASSERT_NE(a, nullptr);
    EXPECT_EQ(((*first).*accessor)(), a);
    auto b = ((*second).*accessor)();
    ASSERT_NE(b, nullptr);
    EXPECT_NE(b, a);
    EXPECT_EQ(((*second).*accessor)(), b);
  };
  check(&DBManager::DBOrganizations);
  check(&DBManager::DBCalStandards);
  check(&DBManager::DBProfiles);
  check(&DBManager::DBStations);
  check(&DBManager::DBUsers);
  check(&DBManager::DBTestRuns);
  check(&DBManager::DBServerDB);
}

TEST(DBManager, TolSetWordGivesTheOneSharedSet) {
  auto manager = DBManager::create();
  auto a = manager->Create(u"TolSet");
  auto b = manager->Create(u"  tolset ");
  auto c = manager->Create(u"TOLSET");
  ASSERT_NE(a, nullptr);
  EXPECT_EQ(b, a);
  EXPECT_EQ(c, a);
  EXPECT_EQ(a->ObjType(), u"TolSet");

  // A member added through one result is seen through the other.
  auto set_a = query<IKVTolSet>(a);
  auto set_b = query<IKVTolSet>(b);
  ASSERT_NE(set_a, nullptr);
  ASSERT_NE(set_b, nullptr);
  auto tol = KVTolerance::create();
  tol->TolName(u"dE max");
  set_a->Add(tol, u"37");
  EXPECT_EQ(set_b->count(), 1);
  EXPECT_EQ(set_b->Item(Variant{Long{37}})->TolName(), u"dE max");

  // Another manager shares a set of its own.
  auto other = DBManager::create()->Create(u"TolSet");
  ASSERT_NE(other, nullptr);
  EXPECT_NE(other, a);
  EXPECT_EQ(query<IKVTolSet>(other)->count(), 0);
}

TEST(DBManager, OtherWordsGiveNewObjectsOfTheirKind) {
  auto manager = DBManager::create();

  auto set1 = manager->Create(u"TileSet");
  auto set2 = manager->Create(u"tileset");
  ASSERT_NE(set1, nullptr);
  ASSERT_NE(set2, nullptr);
  EXPECT_NE(set1, set2);
  EXPECT_EQ(set1->ObjType(), u"TileSet");
  EXPECT_NE(std::dynamic_pointer_cast<KVTileSet>(set1), nullptr);
  // Distinct sets: a change to one is not seen through the other.
  query<IKVTileSet>(set1)->TSN(u"TS000042");
  EXPECT_EQ(set1->ID().to_string(), u"TS000042");
  EXPECT_EQ(set2->ID().to_string(), u"");

  auto cal = manager->Create(u" CALIBRATION");
  ASSERT_NE(cal, nullptr);
  EXPECT_NE(std::dynamic_pointer_cast<KVCalibration>(cal), nullptr);
  EXPECT_NE(manager->Create(u"Calibration"), cal);

  auto deltas = manager->Create(u"testruntiledes");
  ASSERT_NE(deltas, nullptr);
  EXPECT_NE(std::dynamic_pointer_cast<KVTestRunTilesDE>(deltas), nullptr);

  // "TestRun" in any case and with surrounding blanks gives a new test run each time.
  std::shared_ptr<IKVObj> previous;
  for (const String word : {u"TestRun", u"testrun", u"TESTRUN", u"  TestRun  "}) {
    auto run = manager->Create(word);
    ASSERT_NE(run, nullptr) << to_utf8(word);
    EXPECT_NE(std::dynamic_pointer_cast<KVTestRun>(run), nullptr);
    EXPECT_NE(run, previous);
    previous = run;
  }
}

TEST(DBManager, NearMissWordsGiveNoObject) {
  auto manager = DBManager::create();
  const String words[] = {
      u"",         u"   ",          u"TestRuns",      u"TestRu",
      u"Test Run", u"TolSets",      u"KVTolSet",      u"TestRunTileDE",
      u"User",     u"Profile",      u"Tolerance",     u"DBManager",
      u"\tTolSet", u"TolSet\n",     u"\u00A0TileSet", String(u"TolSet\0", 7),
      u"TileSet.", u"Calibrations",
  };
  for (const String& word : words) {
    EXPECT_EQ(manager->Create(word), nullptr) << to_utf8(word);
  }
  // A refused word leaves no shared set behind: the next TolSet is still the first one made.
  auto set = manager->Create(u"TolSet");
  ASSERT_NE(set, nullptr);
  EXPECT_EQ(query<IKVTolSet>(set)->count(), 0);
}

TEST(DBManager, DatabaseOperationsFailAndRaiseNoEvent) {
  auto manager = DBManager::create();
  int raised = 0;
  manager->DBOpened.connect([&raised] { ++raised; });

  for (eDBProviders provider :
       {eDBProviders::SQLOLEDB, eDBProviders::JET40, eDBProviders::ORACLE, eDBProviders::ODBC}) {
    EXPECT_FALSE(manager->OpenDB(provider, u"kv"));
    EXPECT_FALSE(manager->OpenDB(provider, u"kv", u"srv", u"sa", u"pw", u"{SQL Server}"));
    EXPECT_FALSE(manager->IsOpen());
  }
  EXPECT_FALSE(manager->CreateDBJET(u"/tmp/kv.mdb"));
  EXPECT_FALSE(manager->CreateDBMSSQL(u"srv", u"kv", u"sa", u"pw"));
  EXPECT_FALSE(manager->CreateServerDB(u"Provider=SQLOLEDB;Data Source=srv"));
  EXPECT_FALSE(manager->IsOpen());
  EXPECT_EQ(raised, 0);
  EXPECT_EQ(manager->DBOpened.connection_count(), 1u);
}

TEST(DBManager, ReleasedManagerLeavesHeldObjectsUsable) {
  auto manager = DBManager::create();
  std::weak_ptr<DBManager> manager_alive = manager;

  auto users = manager->DBUsers();
  auto set = query<IKVTolSet>(manager->Create(u"TolSet"));
  ASSERT_NE(set, nullptr);
  // Objects the caller does not hold go with the manager.
  std::weak_ptr<Stations> stations = manager->DBStations();
  std::weak_ptr<Organizations> organizations = manager->DBOrganizations();
  std::weak_ptr<IKVObj> tile_set = manager->Create(u"TileSet");
  EXPECT_TRUE(tile_set.expired());
  EXPECT_FALSE(stations.expired());

  manager.reset();
  EXPECT_TRUE(manager_alive.expired());
  EXPECT_TRUE(stations.expired());
  EXPECT_TRUE(organizations.expired());

  tUser user;
  user.USERID = u"jdoe";
  const tUser before = user;
  EXPECT_FALSE(users->Retrieve(Long{1}, user));
  EXPECT_EQ(user, before);

  auto tol = KVTolerance::create();
  tol->MaxFail(1.5);
  set->Add(tol, u"5");
  set->InstTypeID(3);
  EXPECT_EQ(set->count(), 1);
  EXPECT_EQ(set->Item(Variant{Long{5}})->MaxFail(), 1.5);
  EXPECT_EQ(query<IKVObj>(set)->ID().to_long(), 3);
}

}  // namespace
}  // namespace kvdata
