#include <gtest/gtest.h>

#include "kvdata/foundation.hpp"

namespace kvdata {
namespace {

// An array that was never dimensioned: rank 0 and asking for bounds raises error 9.
template <class T>
void ExpectNoBounds(const Array<T>& a) {
  EXPECT_EQ(a.rank(), 0);
  EXPECT_EQ(a.size(), 0u);
  try {
    (void)a.lbound();
    ADD_FAILURE() << "lbound of an array without bounds did not raise";
  } catch (const Error& e) {
    EXPECT_EQ(e.number(), kSubscriptOutOfRange);
  }
}

tOrganization FilledOrganization() {
  tOrganization org;
  org.ID = 12;
  org.Organization = u"Kelvanto Labs";
  org.ParentOrgID = 3;
  org.RootOrgID = 1;
  org.Alias = u"KL";
  org.Avail = u"Y";
  return org;
}

tUser FilledUser() {
  tUser user;
  user.USERID = u"jdoe";
  user.UserNumber = 42;
  user.LastName = u"Doe";
  user.FirstName = u"Jane";
  user.UserPWD = u"secret";
  user.UserMail = u"jdoe@example.org";
  user.OrgID = 12;
  user.RoleCode = u"A";
  user.Disabled = u"N";
  return user;
}

tTileSet FilledTileSet() {
  tTileSet set;
  set.TSN = u"TS000042";
  set.Tiles.redim(1, 13);
  set.Tiles(5).Name = u"Blue";
  set.Tiles(5).ColorRGB = 0xFF0000;
  set.Tiles(5).TempComp.Data(40) = 0.25f;
  return set;
}

tTileSetCalibration FilledCalibration() {
  tTileSetCalibration cal;
  cal.TSN = u"TS000042";
  cal.Certified = Date{45000.5};
  cal.TempCalibrated = 23.5f;
  cal.Tiles.redim(1, 13);
  cal.Tiles(13).Spectrum(eSC::SCI).Data(1) = 87.5f;
  return cal;
}

tTestRun1 FilledTestRun() {
  tTestRun1 run;
  run.ISN = u"ISN-7";
  run.UserNumber = 42;
  run.StationGUID = u"{0A1B}";
  run.TestDate = Date{45001.25};
  run.Comment = u"after service";
  run.Stats.TestResult = eTestResult::Fail;
  run.LightLevels.LightLevels(8).Data(20) = 1.5f;
  run.Repeatability.WhiteTileRMSdE = 0.125f;
  run.IIA.TSN = u"TS000042";
  run.IIA.Measurements(2).Tiles.redim(1, 2);
  run.IIA.Measurements(2).Tiles(2).Trial.Spectrum(eSC::SCE).Data(3) = 4.0f;
  run.IIA.Has2Measurement = true;
  return run;
}

tOVProfile FilledProfile() {
  tOVProfile profile;
  profile.ISN = u"ISN-7";
  profile.Created = Date{44999.0};
  profile.Validated = true;
  tOVProfileDataV1 data;
  data.Dark(eSC::SCI).Data(7) = -0.5f;
  profile.ProfileData = data;
  return profile;
}

TEST(Facades, RecordArgumentsComeBackAsTheyWere) {
  auto orgs = Organizations::create();
  const tOrganization org_before = FilledOrganization();
  tOrganization org = org_before;
  EXPECT_FALSE(orgs->Retrieve(u"KL", org));
  EXPECT_FALSE(orgs->Update(org));
  EXPECT_FALSE(orgs->AddNew(org));
  EXPECT_EQ(org, org_before);

  auto stations = Stations::create();
  tStation station{u"{0A1B}", u"Bench 3", u"bench3@example.org"};
  const tStation station_before = station;
  EXPECT_FALSE(stations->Retrieve(u"{0A1B}", station));
  EXPECT_FALSE(stations->AddNew(station));
  EXPECT_FALSE(stations->Update(station));
  EXPECT_EQ(station, station_before);

  auto users = USers::create();
  const tUser user_before = FilledUser();
  tUser user = user_before;
  EXPECT_FALSE(users->Retrieve(Long{42}, user));
  EXPECT_FALSE(users->RetrieveOrgUser(Long{12}, u"jdoe", user));
  EXPECT_FALSE(users->AddNew(user));
  EXPECT_FALSE(users->Update(user));
  EXPECT_EQ(user, user_before);

  auto cal_standards = CalStandards::create();
  const tTileSet set_before = FilledTileSet();
  tTileSet set = set_before;
  EXPECT_FALSE(cal_standards->RetrieveTileSet(u"TS000042", set));
  EXPECT_FALSE(cal_standards->AddNewTileSet(set));
  EXPECT_EQ(set, set_before);
  const tTileSetCalibration cal_before = FilledCalibration();
  tTileSetCalibration cal = cal_before;
  const Variant certified = Date{45000.5};
  EXPECT_FALSE(cal_standards->RetrieveCalibration(u"TS000042", cal));
  EXPECT_FALSE(cal_standards->RetrieveCalibration(u"TS000042", cal, &certified));
  EXPECT_FALSE(cal_standards->AddNewCalibration(cal));
  EXPECT_EQ(cal, cal_before);

  auto test_runs = TestRun1::create();
  const tTestRun1 run_before = FilledTestRun();
  tTestRun1 run = run_before;
  EXPECT_FALSE(test_runs->Retrieve(u"ISN-7", Date{45001.25}, run));
  EXPECT_FALSE(test_runs->RetrieveByID(Long{9}, run));
  EXPECT_FALSE(test_runs->AddNew(run));
  EXPECT_EQ(run, run_before);

  auto profiles = Profiles::create();
  const tOVProfile profile_before = FilledProfile();
  tOVProfile profile = profile_before;
  EXPECT_FALSE(profiles->Retrieve(u"ISN-7", Date{44999.0}, profile));
  EXPECT_FALSE(profiles->RetrieveLatest(u"ISN-7", profile));
  EXPECT_FALSE(profiles->AddNew(profile));
  EXPECT_EQ(profile, profile_before);
  EXPECT_EQ(profile.ProfileData.get<tOVProfileDataV1>().Dark(eSC::SCI).Data(7), -0.5f);

  // An out array keeps its bounds and elements.
  auto server = ServerDB::create();
  Array<String> isns(3, 4);
  isns(4) = u"ISN-7";
  const Array<String> isns_before = isns;
  EXPECT_FALSE(server->GetUserISNs(Long{42}, isns));
  EXPECT_EQ(isns, isns_before);
  EXPECT_EQ(isns.lbound(), 3);
}

TEST(Facades, QueriesAnswerFalse) {
  auto orgs = Organizations::create();
  EXPECT_FALSE(orgs->Delete(u"KL"));

  auto stations = Stations::create();
  EXPECT_FALSE(stations->Delete(u"{0A1B}"));

  auto users = USers::create();
  EXPECT_FALSE(users->ExistsUser(Long{12}, u"jdoe"));
  EXPECT_FALSE(users->Delete(Long{12}, u"jdoe"));

  auto server = ServerDB::create();
  EXPECT_FALSE(server->AddNewServerOpLog(u"10.0.0.5", u"1.4", Date{45000.0}, u"ISN-7", u"TS000042",
                                         Long{1200}, true, u"ok"));

  auto cal_standards = CalStandards::create();
  EXPECT_FALSE(cal_standards->ExistsTileSet(u"TS000042"));
  EXPECT_FALSE(cal_standards->ExistsCalibration(u"TS000042", Date{45000.5}));
  EXPECT_FALSE(cal_standards->DeleteTileSet(u"TS000042"));
  EXPECT_FALSE(cal_standards->DeleteCalibration(u"TS000042", Date{45000.5}));

  auto test_runs = TestRun1::create();
  EXPECT_FALSE(test_runs->Delete(u"ISN-7", Date{45001.25}));

  auto profiles = Profiles::create();
  const Variant created = Date{44999.0};
  const Variant validated = true;
  EXPECT_FALSE(profiles->ExistsProfile(u"ISN-7"));
  EXPECT_FALSE(profiles->ExistsProfile(u"ISN-7", &created, &validated));
  EXPECT_FALSE(profiles->Delete(u"ISN-7", Date{44999.0}));
}

TEST(Facades, ListsHaveNoBoundsAndDatesAreZero) {
  ExpectNoBounds(Organizations::create()->List());
  ExpectNoBounds(Stations::create()->List());
  ExpectNoBounds(USers::create()->List());

  auto cal_standards = CalStandards::create();
  ExpectNoBounds(cal_standards->ListTileSets());
  ExpectNoBounds(cal_standards->ListCalibrations(u"TS000042"));

  auto test_runs = TestRun1::create();
  ExpectNoBounds(test_runs->ListAvailableIntruments());
  ExpectNoBounds(test_runs->ListTestRuns(u"ISN-7"));
  EXPECT_EQ(test_runs->GetLastTRDate(u"ISN-7"), Date{});
  EXPECT_EQ(test_runs->GetFirstTRDate(u""), Date{});
  EXPECT_EQ(test_runs->GetLastTRDate(u"ISN-7").days, 0.0);

  auto profiles = Profiles::create();
  ExpectNoBounds(profiles->ListAvailableProfiles());
  ExpectNoBounds(profiles->ListInstrumentProfiles(u"ISN-7"));
  ExpectNoBounds(profiles->ListInstrumentProfiles(u"ISN-7", false));
}

TEST(Facades, NoTestRunCursorIsHandedOut) {
  auto test_runs = TestRun1::create();
  EXPECT_EQ(test_runs->GetIterator(u"ISN-7"), nullptr);
  EXPECT_EQ(test_runs->GetIterator(u"ISN-7", true, u"TS000042", u"jdoe", u"{0A1B}"), nullptr);

  // The cursor class itself is inert: every move fails and the current run is empty.
  auto it = TestRun1Iterator::create();
  EXPECT_FALSE(it->MoveFirst());
  EXPECT_FALSE(it->MoveNext());
  EXPECT_FALSE(it->MovePrevious());
  EXPECT_FALSE(it->MoveLast());
  EXPECT_FALSE(it->MoveDirect(Date{45001.25}));
  const tTestRun1 run = it->TestRun();
  EXPECT_EQ(run, tTestRun1{});
  EXPECT_TRUE(run.ISN.empty());
  EXPECT_EQ(run.TestDate, Date{});
  EXPECT_EQ(run.Stats.TestResult, eTestResult::Certified);
  EXPECT_EQ(run.Repeatability.BlueTileStdDev.Data(1), 0.0f);
  EXPECT_FALSE(run.IIA.Has2Measurement);
  EXPECT_EQ(run.IIA.Measurements(1).Tiles.rank(), 0);
}

}  // namespace
}  // namespace kvdata
