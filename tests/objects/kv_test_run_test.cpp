#include "kvdata/objects/kv_test_run.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <limits>
#include <memory>

#include "kvdata/kvdata.hpp"
#include "support/streams.hpp"

namespace kvdata {
namespace {

using testing::Bytes;
using testing::contents;
using testing::encoding;
using testing::LogCapture;
using testing::prefix;
using testing::stream_of;
using testing::Wire;

constexpr Long kLongMax = std::numeric_limits<Long>::max();

const Bytes kStamp14 = {0x33, 0x33, 0xB3, 0x3F};
const Bytes kStamp12 = {0x9A, 0x99, 0x99, 0x3F};

Bytes slice(const Bytes& bytes, std::size_t from, std::size_t to) {
  return Bytes(bytes.begin() + static_cast<std::ptrdiff_t>(from),
               bytes.begin() + static_cast<std::ptrdiff_t>(to));
}

tIIATile iia_tile(float base) {
  tIIATile tile;
  for (Long k = 0; k <= 1; ++k) {
    for (Long band = 1; band <= 40; ++band) {
      tile.Trial.Spectrum(k).Data(band) = base + static_cast<float>(k * 100 + band);
      tile.TrialProfiled.Spectrum(k).Data(band) = -base - static_cast<float>(k * 100 + band);
    }
  }
  return tile;
}

// A record with every streamed field set, two IIA series, and light-level
// spectra (which the stream does not carry).
tTestRun1 full_record() {
  tTestRun1 r;
  r.ISN = u"SN-0042";
  r.UserNumber = 17;
  r.StationGUID = u"{0A1B}";
  r.TestDate = Date{45123.25};
  r.Comment = u"after service";
  r.Stats = {eTestResult::Pass, u"all passed", Date{1.5}, Date{2.5}};
  r.CommunicationsTest = {eTestResult::Fail, u"timeout", Date{3.5}, Date{4.5}};
  r.LightLevels.Stats = {eTestResult::NA, u"", Date{5.5}, Date{6.5}};
  r.LightLevels.LightLevels(3).Data(7) = 42.0f;
  r.Repeatability.Stats = {eTestResult::Certified, u"rep", Date{7.5}, Date{8.5}};
  for (Long band = 1; band <= 40; ++band) {
    r.Repeatability.BlueTileStdDev.Data(band) = static_cast<float>(band) / 8;
    r.Repeatability.WhiteTileStdDev.Data(band) = static_cast<float>(band) / 16;
  }
  r.Repeatability.BlueTileMaxdE = 1.25f;
  r.Repeatability.BlueTileRMSdE = 2.25f;
  r.Repeatability.BlueTileDriftdE = 3.25f;
  r.Repeatability.WhiteTileMaxdE = 4.25f;
  r.Repeatability.WhiteTileRMSdE = 5.25f;
  r.Repeatability.WhiteTileDriftdE = 6.25f;
  r.IIA.Stats = {eTestResult::Pass, u"iia", Date{9.5}, Date{10.5}};
  r.IIA.TSN = u"TS-9";
  r.IIA.CalStandard = Date{44000.0};
  r.IIA.Has2Measurement = true;
  r.IIA.Measurements(1).Profile = Date{44001.0};
  r.IIA.Measurements(1).Tiles.redim(1, 2);
  r.IIA.Measurements(1).Tiles(1) = iia_tile(1000);
  r.IIA.Measurements(1).Tiles(2) = iia_tile(2000);
  r.IIA.Measurements(2).Profile = Date{44002.0};
  r.IIA.Measurements(2).Tiles.redim(1, 1);
  r.IIA.Measurements(2).Tiles(1) = iia_tile(3000);
  return r;
}

std::shared_ptr<KVTestRun> run_with(const tTestRun1& record, const String& light_level_data) {
  auto run = KVTestRun::create();
  run->v1TestRun(record);
  run->LightLevelData(light_level_data);
  return run;
}

TEST(KVTestRun, StreamStartsWithTheVersionAndEndsWithTheLightLevelData) {
  tTestRun1 record;
  record.ISN = u"SN1";
  record.UserNumber = 7;
  auto run = run_with(record, u"L1");

  Wire w;
  w.raw({0x33, 0x33, 0xB3, 0x3F});
  w.raw({0x03, 0x00, 0x00, 0x00, 'S', 'N', '1'}).raw({0x07, 0x00, 0x00, 0x00});
  w.zeros(4 + 8 + 4);            // StationGUID, TestDate, Comment
  w.zeros(4 * (4 + 4 + 8 + 8));  // four test statistics
  w.zeros(2 * (160 + 12));       // blue and white tile
  w.zeros(4 + 4 + 8 + 8);        // IIA statistics
  w.zeros(8 + 4 + 1);            // CalStandard, TSN, Has2Measurement
  w.zeros(8 + 2);                // one series: Profile, no tiles
  w.raw({0x02, 0x00, 0x00, 0x00, 'L', '1'});
  ASSERT_EQ(w.bytes.size(), 524u);

  ByteArray stream;  // never given bounds: the writer creates it from index 0
  Long pos = 0;
  EXPECT_TRUE(run->StreamOut(stream, pos));
  EXPECT_EQ(pos, 524);
  EXPECT_EQ(prefix(contents(stream), 524), w.bytes);
  EXPECT_EQ(run->StreamLen(), 524);

  // A new object: version 1.4, an empty record and no light-level text.
  const Bytes fresh = encoding(*KVTestRun::create());
  ASSERT_EQ(fresh.size(), 519u);
  EXPECT_EQ(prefix(fresh, 4), kStamp14);
  EXPECT_EQ(slice(fresh, 4, 519), Bytes(515, 0));
}

TEST(KVTestRun, RecordThatCannotBeWrittenCarriesNoLightLevelData) {
  tTestRun1 record = full_record();
  record.IIA.Measurements(1).Tiles.redim(40000, 40000);  // outside the 16-bit tile index
  auto run = run_with(record, u"light");

  ByteArray stream(0, 99);
  for (Byte& b : stream) b = 0xAA;
  Long pos = 10;
  EXPECT_FALSE(run->StreamOut(stream, pos));
  EXPECT_EQ(pos, 14);  // the version only
  EXPECT_EQ(stream.ubound(), 14);
  EXPECT_EQ(slice(contents(stream), 10, 14), kStamp14);
  EXPECT_EQ(stream(9), 0xAA);
  EXPECT_EQ(stream(14), 0xAA);  // the spare byte is never written
  EXPECT_EQ(run->StreamLen(), 4);
}

TEST(KVTestRun, IdentityValuesAndRights) {
  auto run = query<KVTestRun>(CreateObject(u"KVData.KVTestRun"));
  EXPECT_EQ(run->ID().type(), VarType::String);
  EXPECT_EQ(run->DateCreated().get<Date>(), Date{});
  query<IKVSecurity>(run)->UserNumber(42);
  EXPECT_EQ(run->v1TestRun().UserNumber, 0);  // the rights' number is not the record's
}

}  // namespace
}  // namespace kvdata
