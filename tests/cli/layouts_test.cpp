// The layout walks of explain, against bytes written out by hand.
#include <gtest/gtest.h>

#include <initializer_list>
#include <string>
#include <vector>

#include "wire/identify.hpp"
#include "wire/layouts.hpp"

namespace kvdata::cli {
namespace {

using Bytes = std::vector<Byte>;

Bytes operator+(Bytes a, const Bytes& b) {
  a.insert(a.end(), b.begin(), b.end());
  return a;
}

Bytes zeros(std::size_t n) {
  return Bytes(n, 0);
}

Bytes text(const std::string& s) {
  return Bytes(s.begin(), s.end());
}

const FieldRow* row(const Walk& w, const std::string& name) {
  for (const auto& r : w.rows) {
    if (r.name == name) return &r;
  }
  return nullptr;
}

TEST(Layouts, StationFieldsSitWhereTheirCountsPutThem) {
  const Bytes b =
      Bytes{0x03, 0, 0, 0} + text("abc") + Bytes{0, 0, 0, 0} + Bytes{0x01, 0, 0, 0} + Bytes{0xE9};
  const Walk w = walk_layout(StreamKind::Station, b);
  ASSERT_FALSE(w.problem);
  ASSERT_EQ(w.rows.size(), 3u);
  EXPECT_EQ(w.rows[0].name, "Station.StationGUID");
  EXPECT_EQ(w.rows[0].offset, 0u);
  EXPECT_EQ(w.rows[0].width, 7u);
  EXPECT_EQ(w.rows[0].value, "\"abc\"");
  EXPECT_EQ(w.rows[1].offset, 7u);
  EXPECT_EQ(w.rows[1].value, "\"\"");
  EXPECT_EQ(w.rows[2].offset, 11u);
  EXPECT_EQ(w.rows[2].value, "\"\xC3\xA9\"");  // Windows-1252 E9 is U+00E9
  EXPECT_EQ(identify(b).kind, StreamKind::Station);
}

TEST(Layouts, StringCountsThatRunPastTheEndOrAreNegativeStopTheWalkAtTheCount) {
  Walk w = walk_layout(StreamKind::Station, Bytes{0x0A, 0, 0, 0} + text("abcdef"));
  ASSERT_TRUE(w.problem);
  EXPECT_EQ(w.problem->offset, 0u);
  EXPECT_EQ(w.problem->field, "Station.StationGUID");
  EXPECT_NE(w.problem->expected.find("10 bytes of text follow, but only 6 are left"),
            std::string::npos);

  w = walk_layout(StreamKind::Station, Bytes{0, 0, 0, 0} + Bytes{0xFB, 0xFF, 0xFF, 0xFF});
  ASSERT_TRUE(w.problem);
  EXPECT_EQ(w.problem->offset, 4u);
  EXPECT_EQ(w.problem->field, "Station.StationName");
  EXPECT_NE(w.problem->expected.find("found -5"), std::string::npos);

  w = walk_layout(StreamKind::Station, Bytes{0, 0, 0, 0, 0, 0, 0, 0, 0, 0});
  ASSERT_TRUE(w.problem);
  EXPECT_EQ(w.problem->offset, 8u);
  EXPECT_EQ(w.problem->field, "Station.StationMail");
  EXPECT_NE(w.problem->expected.find("only 2 are left"), std::string::npos);
}

TEST(Layouts, UserStreamNeedsItsStampAndItsSpareByte) {
  const Bytes stamp12{0x9A, 0x99, 0x99, 0x3F};
  Walk w = walk_layout(StreamKind::User, stamp12 + zeros(844) + zeros(1));
  ASSERT_FALSE(w.problem);
  ASSERT_NE(row(w, "v1User.OrgID"), nullptr);
  EXPECT_EQ(row(w, "v1User.OrgID")->offset, 840u);
  EXPECT_EQ(row(w, "v1User.Disabled")->offset, 846u);
  EXPECT_EQ(row(w, "v1User.UserMail")->width, 510u);

  w = walk_layout(StreamKind::User, Bytes{0x33, 0x33, 0xB3, 0x3F} + zeros(845));
  ASSERT_TRUE(w.problem);
  EXPECT_EQ(w.problem->offset, 0u);
  EXPECT_EQ(w.problem->field, "stream version");
  EXPECT_NE(w.problem->expected.find("1.2; found 1.4"), std::string::npos);

  w = walk_layout(StreamKind::User, stamp12 + zeros(844));
  ASSERT_TRUE(w.problem);
  EXPECT_EQ(w.problem->offset, 848u);
  EXPECT_EQ(w.problem->field, "spare byte");

  w = walk_layout(StreamKind::User, stamp12 + zeros(844) + zeros(2));
  ASSERT_TRUE(w.problem);
  EXPECT_EQ(w.problem->field, "end of stream");
  EXPECT_EQ(w.problem->offset, 849u);
}

TEST(Layouts, TileCountsMustFitBeforeAnyTileIsRead) {
  // TSN "", then 13 tiles but only a few bytes left.
  Walk w = walk_layout(StreamKind::TileSetCalibration, zeros(4) + Bytes{13, 0, 0, 0} + zeros(100));
  ASSERT_TRUE(w.problem);
  EXPECT_EQ(w.problem->offset, 4u);
  EXPECT_EQ(w.problem->field, "TS.Tiles count");
  EXPECT_NE(w.problem->expected.find("it says 13 tiles"), std::string::npos);

  w = walk_layout(StreamKind::TileSetCalibration, zeros(4) + Bytes{0xFF, 0, 0, 0} + zeros(100));
  ASSERT_TRUE(w.problem);
  EXPECT_NE(w.problem->expected.find("from 1 to 254; found 255"), std::string::npos);

  // One tile: name "W", colour, 40 Singles, date, temperature, 80 Singles.
  const Bytes one = zeros(4) + Bytes{1, 0, 0, 0} + Bytes{1, 0, 0, 0, 'W'} +
                    Bytes{0xFF, 0xFF, 0xFF, 0} + zeros(160) + zeros(8) + zeros(4) + zeros(320);
  w = walk_layout(StreamKind::TileSetCalibration, one);
  ASSERT_FALSE(w.problem);
  EXPECT_EQ(row(w, "TS.Tiles(1).ColorRGB")->value, "16777215 (#FFFFFF)");
  EXPECT_EQ(row(w, "TSC.Certified")->offset, 4u + 4 + 5 + 4 + 160);
  EXPECT_EQ(row(w, "TSC.Tiles(1).SCI(40)")->offset, one.size() - 4);
}

TEST(Layouts, ProfileRecordNameAndTestRunSeriesAreChecked) {
  const Bytes head = zeros(4) + zeros(8) + Bytes{1};
  Walk w = walk_layout(StreamKind::ProfileRecord, head + Bytes{3, 0, 0, 0} + text("tOV"));
  ASSERT_TRUE(w.problem);
  EXPECT_EQ(w.problem->field, "record name");
  EXPECT_EQ(w.problem->offset, 13u);

  const Bytes name = Bytes{16, 0, 0, 0} + text("tOVProfileDataV1");
  w = walk_layout(StreamKind::ProfileRecord, head + name + zeros(1280));
  ASSERT_FALSE(w.problem);
  // Interleaved: for SCE then SCI, for each band, wCal, wave, Linear, Dark.
  EXPECT_EQ(row(w, "pro.ProfileData.wave.SCE(1)")->offset, 33u + 4);
  EXPECT_EQ(row(w, "pro.ProfileData.wCal.SCE(2)")->offset, 33u + 16);
  EXPECT_EQ(row(w, "pro.ProfileData.Dark.SCI(40)")->offset, 33u + 1276);
  EXPECT_EQ(identify(head + name + zeros(1280)).kind, StreamKind::ProfileRecord);

  // A test run record whose single series says 3 tiles with no bytes left for them.
  const Bytes stats = zeros(4) + zeros(4) + zeros(8) + zeros(8);
  const Bytes tr = zeros(4) + zeros(4) + zeros(4) + zeros(8) + zeros(4) + stats + stats + stats +
                   stats + zeros(160) + zeros(12) + zeros(160) + zeros(12) + stats + zeros(8) +
                   zeros(4) + Bytes{0} + zeros(8) + Bytes{3, 0};
  w = walk_layout(StreamKind::TestRunRecord, tr);
  ASSERT_TRUE(w.problem);
  EXPECT_EQ(w.problem->field, "TR.IIA.Measurements(1).Tiles count");
  EXPECT_EQ(w.problem->offset, tr.size() - 2);
  // Drift comes before RMS in the stream.
  EXPECT_LT(row(w, "TR.Repeatability.BlueTileDriftdE")->offset,
            row(w, "TR.Repeatability.BlueTileRMSdE")->offset);
}

TEST(Layouts, ToleranceSetMemberCountMustFit) {
  Bytes header = zeros(528) + Bytes{2, 0, 0, 0} + zeros(1);
  Walk w = walk_layout(StreamKind::TolSet, header + zeros(749) + zeros(1));
  ASSERT_TRUE(w.problem);
  EXPECT_EQ(w.problem->offset, 528u);
  EXPECT_EQ(w.problem->field, "member count");
  w = walk_layout(StreamKind::TolSet, header + zeros(2 * 749) + zeros(1));
  ASSERT_FALSE(w.problem);
  EXPECT_EQ(row(w, "Tolerances(2).MaxFail")->offset, 533u + 749 + 640);
}

TEST(Layouts, FixedBlocksPutEachFieldAtItsOffset) {
  Walk w = walk_layout(StreamKind::Organization, zeros(133));
  ASSERT_FALSE(w.problem);
  EXPECT_EQ(row(w, "Org.Organization")->offset, 4u);
  EXPECT_EQ(row(w, "Org.ParentOrgID")->offset, 104u);
  EXPECT_EQ(row(w, "Org.RootOrgID")->offset, 108u);
  EXPECT_EQ(row(w, "Org.Alias")->offset, 112u);
  EXPECT_EQ(row(w, "Org.Avail")->offset, 128u);
  EXPECT_EQ(row(w, "zero bytes")->offset, 130u);

  w = walk_layout(StreamKind::UserBlock, zeros(261));
  ASSERT_FALSE(w.problem);
  EXPECT_EQ(row(w, "User.UserNumber")->offset, 16u);
  EXPECT_EQ(row(w, "User.FirstName")->offset, 80u);
  EXPECT_EQ(row(w, "User.UserMail")->offset, 156u);
  EXPECT_EQ(row(w, "User.OrgID")->offset, 256u);
  EXPECT_EQ(row(w, "User.RoleCode")->offset, 260u);
  EXPECT_EQ(row(w, "User.RoleCode")->width, 1u);

  w = walk_layout(StreamKind::Calibration, zeros(4189));
  ASSERT_FALSE(w.problem);
  EXPECT_EQ(row(w, "v1Calibration.Certified")->offset, 16u);
  EXPECT_EQ(row(w, "v1Calibration.Tiles(1).SCE(1)")->offset, 28u);
  EXPECT_EQ(row(w, "v1Calibration.Tiles(2).SCE(1)")->offset, 348u);
  EXPECT_EQ(row(w, "v1Calibration.Tiles(13).SCI(40)")->offset, 4184u);
  EXPECT_EQ(row(w, "spare byte")->offset, 4188u);

  // A tile set: TSN "AB" (a 6-byte codec String), then 13 blocks of 264.
  w = walk_layout(StreamKind::TileSet, Bytes{2, 0, 0, 0, 'A', 'B'} + zeros(13 * 264));
  ASSERT_FALSE(w.problem);
  EXPECT_EQ(row(w, "v1TileSet.Tiles(2).Name")->offset, 6u + 264);
  EXPECT_EQ(row(w, "v1TileSet.Tiles(13).ColorRGB")->offset, 6u + 12 * 264 + 100);
  EXPECT_EQ(row(w, "v1TileSet.Tiles(13).TempComp(40)")->offset, 6u + 13 * 264 - 4);

  // A tolerance: limits after the 2-byte gap, Misc at 648, the dropped byte at 748.
  w = walk_layout(StreamKind::Tolerance, zeros(749));
  ASSERT_FALSE(w.problem);
  EXPECT_EQ(row(w, "MinFail")->offset, 616u);
  EXPECT_EQ(row(w, "MaxFail")->offset, 640u);
  EXPECT_EQ(row(w, "Misc")->offset, 648u);
  EXPECT_EQ(row(w, "trailing byte")->offset, 748u);
}

TEST(Layouts, ProfileObjectTablesAndBandWidthsFollowTheRecord) {
  const Bytes head = Bytes{0x33, 0x33, 0xB3, 0x3F} + Bytes{0x68, 1, 0, 0} + Bytes{0xEE, 2, 0, 0} +
                     Bytes{10, 0, 0, 0};
  const Bytes record = Bytes{4, 0, 0, 0} + text("SP64") + zeros(8) + Bytes{1} + Bytes{16, 0, 0, 0} +
                       text("tOVProfileDataV1") + zeros(1280);
  const Walk w = walk_layout(StreamKind::Profile, head + record + zeros(320) + zeros(1));
  ASSERT_FALSE(w.problem);
  EXPECT_EQ(row(w, "StartWL")->value, "360");
  EXPECT_EQ(row(w, "EndWl")->value, "750");
  EXPECT_EQ(row(w, "ISN")->value, "\"SP64\"");
  EXPECT_EQ(row(w, "Validated")->value, "True");
  const std::size_t tables = 16 + 8 + 8 + 1 + 20;
  EXPECT_EQ(row(w, "WaveCorrection.SCE(1)")->offset, tables + 4);
  EXPECT_EQ(row(w, "DarkCorrection.SCI(40)")->offset, tables + 1276);
  EXPECT_EQ(row(w, "BandWidthCorrection.SCE(1)")->offset, tables + 1280);
  EXPECT_EQ(row(w, "BandWidthCorrection.SCI(1)")->offset, tables + 1280 + 160);
  EXPECT_EQ(row(w, "spare byte")->offset, tables + 1600);

  const Walk stamp = walk_layout(StreamKind::Profile, Bytes{0x9A, 0x99, 0x99, 0x3F} + record);
  ASSERT_TRUE(stamp.problem);
  EXPECT_EQ(stamp.problem->field, "stream version");
}

TEST(Layouts, IdentificationUsesStampsLengthsAndStructure) {
  EXPECT_EQ(identify(Bytes{0x9A, 0x99, 0x99, 0x3F} + zeros(845)).kind, StreamKind::User);
  EXPECT_EQ(identify(zeros(320)).kind, StreamKind::SCPair);
  EXPECT_EQ(identify(zeros(133)).kind, StreamKind::Organization);
  EXPECT_EQ(identify(zeros(261)).kind, StreamKind::UserBlock);
  EXPECT_EQ(identify(zeros(265)).kind, StreamKind::Tile);
  EXPECT_EQ(identify(zeros(750)).kind, StreamKind::Tolerance);
  const Identification none = identify(Bytes{1, 2, 3, 4, 5});
  EXPECT_FALSE(none.kind);
  EXPECT_NE(none.reason.find("no kind of stream fits these 5 bytes"), std::string::npos);
}

}  // namespace
}  // namespace kvdata::cli
