// The JSON form of the records: names, shapes, strict reading.
#include <gtest/gtest.h>

#include <string>

#include "json/records.hpp"
#include "kvdata/automation/text.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

std::string error_of(const Json& j, auto& record, const std::string& path = "R") {
  try {
    read_record(j, path, record);
  } catch (const InputError& e) {
    return e.what();
  }
  return "";
}

tTestRun1 sample_test_run() {
  tTestRun1 tr;
  tr.ISN = u"SP64-0042";
  tr.UserNumber = 17;
  tr.TestDate = Date{45366.5};
  tr.Stats.TestResult = eTestResult::Fail;
  tr.Repeatability.BlueTileDriftdE = 0.125f;
  tr.IIA.Has2Measurement = true;
  tr.IIA.Measurements(2).Tiles.redim(1, 2);
  tr.IIA.Measurements(2).Tiles(2).TrialProfiled.Spectrum(eSC::SCI).Data(40) = 61.5f;
  tr.IIA.Measurements(2).Profile = Date{45300.0};
  return tr;
}

TEST(JsonRecords, FieldsAreNamedAndOrderedAsTheRecordsDeclareThem) {
  const Json j = write_record(sample_test_run());
  std::vector<std::string> names;
  for (const auto& [k, v] : j.items()) names.push_back(k);
  EXPECT_EQ(names, (std::vector<std::string>{"ISN", "UserNumber", "StationGUID", "TestDate",
                                             "Comment", "Stats", "CommunicationsTest",
                                             "LightLevels", "Repeatability", "IIA"}));
  EXPECT_EQ(j["Stats"]["TestResult"], "Fail");
  EXPECT_EQ(j["TestDate"], "2024-03-15T12:00:00");
  EXPECT_EQ(j["Repeatability"]["BlueTileDriftdE"].dump(), "0.125");
  // SC pairs are named SCE and SCI spectra of 40 values, band 1 first.
  const Json& pair = j["IIA"]["Measurements"][1]["Tiles"][1]["TrialProfiled"];
  ASSERT_EQ(pair["SCI"].size(), 40u);
  EXPECT_EQ(pair["SCI"][39].dump(), "61.5");
  EXPECT_EQ(pair["SCE"][39].dump(), "0.0");
  EXPECT_EQ(j["IIA"]["Measurements"][0]["Tiles"], Json::array());

  tTestRun1 back;
  read_record(Json::parse(j.dump()), "TR", back);
  EXPECT_EQ(back, sample_test_run());
}

TEST(JsonRecords, ProfileDataIsItsTablesOrNull) {
  tOVProfile pro;
  pro.ISN = u"SP64-0042";
  EXPECT_TRUE(write_record(pro)["ProfileData"].is_null());
  tOVProfileDataV1 tables;
  tables.Dark(eSC::SCI).Data(7) = -0.25f;
  pro.ProfileData = Variant(tables);
  const Json j = write_record(pro);
  EXPECT_EQ(j["ProfileData"]["Dark"]["SCI"][6].dump(), "-0.25");
  tOVProfile back;
  read_record(j, "pro", back);
  ASSERT_NE(back.ProfileData.get_if<tOVProfileDataV1>(), nullptr);
  EXPECT_EQ(*back.ProfileData.get_if<tOVProfileDataV1>(), tables);
}

TEST(JsonRecords, ReadingIsStrictAndNamesTheField) {
  tStation st;
  Json j = write_record(st);
  j["StationNmae"] = "typo";
  EXPECT_NE(error_of(j, st, "Station").find("Station.StationNmae: unknown field"),
            std::string::npos);
  j = write_record(st);
  j.erase("StationMail");
  EXPECT_NE(error_of(j, st, "Station").find("Station.StationMail: missing"), std::string::npos);

  tTileSetCalibration tsc;
  tsc.Tiles.redim(1, 2);
  j = write_record(tsc);
  j["Tiles"][1]["SCI"].erase(39);
  EXPECT_NE(error_of(j, tsc, "TSC").find("TSC.Tiles(2).SCI: expected 40 values, found 39"),
            std::string::npos);
  j = write_record(tsc);
  j["Tiles"][0]["SCE"][4] = "x";
  EXPECT_NE(error_of(j, tsc, "TSC").find("TSC.Tiles(1).SCE(5): expected a number"),
            std::string::npos);

  tUser user;
  j = write_record(user);
  j["UserNumber"] = 2147483648LL;
  EXPECT_NE(error_of(j, user, "User").find("User.UserNumber: expected a whole number"),
            std::string::npos);
  j["UserNumber"] = 1.5;
  EXPECT_NE(error_of(j, user, "User").find("User.UserNumber"), std::string::npos);

  tTestStats stats;
  j = write_record(stats);
  j["TestResult"] = "Passed";
  EXPECT_NE(error_of(j, stats, "S").find("S.TestResult"), std::string::npos);
  j["TestResult"] = 7;  // outside the enumeration, but a value a stream can carry
  EXPECT_EQ(error_of(j, stats, "S"), "");
  EXPECT_EQ(static_cast<Long>(stats.TestResult), 7);
  EXPECT_EQ(write_record(stats)["TestResult"], 7);
}

TEST(JsonRecords, EmptyDynamicArraysHaveNoBoundsAndOthersStartAtOne) {
  tTileSet ts;
  Json j = write_record(ts);
  EXPECT_EQ(j["Tiles"], Json::array());
  ts.Tiles.redim(0, 12);
  ts.Tiles(0).Name = u"White";
  j = write_record(ts);
  tTileSet back;
  read_record(j, "TS", back);
  EXPECT_EQ(back.Tiles.lbound(), 1);
  EXPECT_EQ(back.Tiles.ubound(), 13);
  EXPECT_EQ(back.Tiles(1).Name, u"White");
  read_record(write_record(tTileSet{}), "TS", back);
  EXPECT_FALSE(back.Tiles.has_bounds());
}

TEST(JsonRecords, TextKeepsNulUnitsAndNonAsciiCharacters) {
  tUser user;
  user.Disabled = String(1, u'\0');
  user.LastName = u"M\u00fcller \u20ac";
  const Json j = Json::parse(write_record(user).dump());
  EXPECT_EQ(j["Disabled"].dump(), "\"\\u0000\"");
  tUser back;
  read_record(j, "User", back);
  EXPECT_EQ(back.Disabled, String(1, u'\0'));
  EXPECT_EQ(back.LastName, u"M\u00fcller \u20ac");
}

TEST(JsonRecords, RecordsWithoutAByteFormRoundTripToo) {
  tTileDeltas deltas;
  deltas.Deltas.redim(1, 2);
  deltas.Deltas(2).dE(eSC::SCI) = 0.75f;
  deltas.avgDeltaE(eSC::SCE) = 0.5f;
  const Json j = write_record(deltas);
  EXPECT_EQ(j["Deltas"][1]["dE"]["SCI"].dump(), "0.75");
  EXPECT_EQ(j["avgDeltaE"]["SCE"].dump(), "0.5");
  tTileDeltas back;
  read_record(j, "D", back);
  EXPECT_EQ(back, deltas);

  tOVProfilePatch patch;
  patch.ISN = u"SP64";
  patch.ProfileData.Linear(eSC::SCE).Data(40) = 1.25f;
  tOVProfilePatch patch_back;
  read_record(write_record(patch), "P", patch_back);
  EXPECT_EQ(patch_back, patch);

  tTSListInfo info;
  info.TSN = u"CT-4471";
  info.Certified = Date{45313.0};
  EXPECT_EQ(write_record(info)["Certified"], "2024-01-22");
}

TEST(JsonRecords, LightLevelSpectraMayBeLeftOut) {
  tTUD_LightLevels levels;
  Json j = write_record(levels);
  ASSERT_EQ(j["LightLevels"].size(), 8u);
  j.erase("LightLevels");
  levels.LightLevels(3).Data(1) = 5.0f;
  read_record(j, "LightLevels", levels);
  EXPECT_EQ(levels.LightLevels(3).Data(1), 0.0f);
}

}  // namespace
}  // namespace kvdata::cli
