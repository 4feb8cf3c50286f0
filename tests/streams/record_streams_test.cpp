#include <gtest/gtest.h>

#include <vector>

#include "kvdata/kvdata.hpp"
#include "streams/stream_test_support.hpp"

namespace kvdata {
namespace {

using testing::contents;
using testing::LogCapture;
using testing::profile;
using testing::profile_tables;
using testing::put;
using testing::sc_pair;
using testing::spectrum;
using testing::stream_of;
using testing::Wire;
using Bytes = std::vector<Byte>;

constexpr auto kTo = eStreamDirection::ToStream;
constexpr auto kFrom = eStreamDirection::FromStream;

Streams& streams() {
  return Streams::instance();
}

TEST(Streams, AnyOtherDirectionDoesNothing) {
  LogCapture log;
  const auto other = static_cast<eStreamDirection>(2);
  ByteArray stream = stream_of({9, 9});
  const ByteArray before = stream;
  Long pos = 0;
  tSCPair pair = sc_pair(1);
  tTileSet ts;
  tTileSetCalibration tsc;
  tOVProfile pro;
  tStation st;
  tTestRun1 tr;
  tUser user;
  tOrganization org;
  EXPECT_FALSE(streams().Stream_SCPair(other, stream, pos, pair));
  EXPECT_FALSE(streams().Stream_TileSetCalibration(other, stream, pos, ts, tsc));
  EXPECT_FALSE(streams().Stream_Profile(other, stream, pos, pro));
  EXPECT_FALSE(streams().Stream_Station(other, stream, pos, st));
  EXPECT_FALSE(streams().Stream_TestRun(other, stream, pos, tr));
  EXPECT_FALSE(streams().Stream_User(other, stream, pos, user));
  EXPECT_FALSE(streams().Stream_Organization(static_cast<eStreamDirection>(-1), stream, pos, org));
  EXPECT_EQ(stream, before);
  EXPECT_EQ(pos, 0);
  EXPECT_EQ(pair, sc_pair(1));
  EXPECT_TRUE(log.entries.empty());
}

TEST(Streams, SCPairIsEightySinglesSCEFirst) {
  tSCPair pair = sc_pair(10);
  ByteArray stream(0, 0);
  Long pos = 0;
  ASSERT_TRUE(streams().Stream_SCPair(kTo, stream, pos, pair));
  EXPECT_EQ(pos, 320);
  EXPECT_EQ(stream.lbound(), 0);
  EXPECT_EQ(stream.ubound(), 319);
  Wire expected;
  put(expected, pair);
  EXPECT_EQ(contents(stream), expected.bytes);
}

TEST(Streams, SCPairWriterGrowsTheStreamAsItsValuesOneByOneWould) {
  LogCapture log;
  const tSCPair pair = sc_pair(3);
  Wire expected;
  put(expected, pair);

  // A loaded stream (lower bound 1) written past its end: it grows to end
  // exactly at the last value, lower bound kept, the gap zero.
  ByteArray loaded = stream_of({0xAA, 0xBB}, 1);
  Long pos = 5;
  tSCPair copy = pair;
  ASSERT_TRUE(streams().Stream_SCPair(kTo, loaded, pos, copy));
  EXPECT_EQ(pos, 325);
  EXPECT_EQ(loaded.lbound(), 1);
  EXPECT_EQ(loaded.ubound(), 324);
  Bytes want{0xAA, 0xBB, 0x00, 0x00};
  want.insert(want.end(), expected.bytes.begin(), expected.bytes.end());
  EXPECT_EQ(contents(loaded), want);
  EXPECT_TRUE(log.entries.empty());
}

TEST(Streams, StationIsThreeStrings) {
  tStation st{u"{0A1B}", u"Lab 2", u""};
  ByteArray stream(0, -1);
  Long pos = 0;
  ASSERT_TRUE(streams().Stream_Station(kTo, stream, pos, st));
  EXPECT_EQ(contents(stream), (Bytes{0x06, 0, 0, 0, '{', '0', 'A', '1', 'B', '}',  //
                                     0x05, 0, 0, 0, 'L', 'a', 'b', ' ', '2',       //
                                     0x00, 0, 0, 0}));
  EXPECT_EQ(pos, 23);
}

// --- Tile set with calibration ---------------------------------------------

tTileSet tile_set(Long lower, Long upper, const String& tsn = u"TS-7") {
  tTileSet ts;
  ts.TSN = tsn;
  ts.Tiles.redim(lower, upper);
  for (Long i = lower; i <= upper; ++i) {
    ts.Tiles(i).Name = u"Tile" + std::u16string(1, static_cast<char16_t>(u'A' + i - lower));
    ts.Tiles(i).ColorRGB = 0x010203 * (i + 1);
    ts.Tiles(i).TempComp = spectrum(static_cast<float>(i) * 100);
  }
  return ts;
}

tTileSetCalibration calibration(Long lower, Long upper, const String& tsn = u"TS-7") {
  tTileSetCalibration tsc;
  tsc.TSN = tsn;
  tsc.Certified = Date{45000.25};
  tsc.TempCalibrated = 23.5f;
  tsc.Tiles.redim(lower, upper);
  for (Long i = lower; i <= upper; ++i) tsc.Tiles(i) = sc_pair(static_cast<float>(i) * 10 + 2000);
  return tsc;
}

Wire expected_tile_set(const tTileSet& ts, const tTileSetCalibration& tsc) {
  Wire w;
  w.str("TS-7").l32(static_cast<std::int32_t>(ts.Tiles.size()));
  for (const tTileDef& tile : ts.Tiles) {
    w.str(to_utf8(tile.Name)).l32(tile.ColorRGB);
    put(w, tile.TempComp);
  }
  w.f64(tsc.Certified.days).f32(tsc.TempCalibrated);
  for (const tSCPair& pair : tsc.Tiles) put(w, pair);
  return w;
}

TEST(Streams, TileSetWithCalibrationAtBoundsZeroToTwelve) {
  tTileSet ts = tile_set(0, 12);
  tTileSetCalibration tsc = calibration(0, 12);
  ByteArray stream(0, -1);
  Long pos = 0;
  ASSERT_TRUE(streams().Stream_TileSetCalibration(kTo, stream, pos, ts, tsc));
  const Wire expected = expected_tile_set(ts, tsc);
  EXPECT_EQ(contents(stream), expected.bytes);
  EXPECT_EQ(pos, static_cast<Long>(expected.size()));
  tTileSet ts_back;
  tTileSetCalibration tsc_back;
  pos = 0;
  ASSERT_TRUE(streams().Stream_TileSetCalibration(kFrom, stream, pos, ts_back, tsc_back));
  EXPECT_EQ(pos, static_cast<Long>(expected.size()));
  EXPECT_EQ(ts_back.Tiles.lbound(), 1);
  EXPECT_EQ(ts_back.Tiles.ubound(), 13);
  EXPECT_EQ(tsc_back.Tiles.lbound(), 1);
  EXPECT_EQ(tsc_back.Tiles.ubound(), 13);
  tTileSet ts_renumbered{ts.TSN, Array<tTileDef>(1, 13)};
  tTileSetCalibration tsc_renumbered = tsc;
  tsc_renumbered.Tiles.redim(1, 13);
  for (Long i = 1; i <= 13; ++i) {
    ts_renumbered.Tiles(i) = ts.Tiles(i - 1);
    tsc_renumbered.Tiles(i) = tsc.Tiles(i - 1);
  }
  EXPECT_EQ(ts_back, ts_renumbered);
  EXPECT_EQ(tsc_back, tsc_renumbered);
}

TEST(Streams, TileSetWriterRefusesBeforeWritingAnything) {
  LogCapture log;
  ByteArray stream = stream_of({7});
  Long pos = 1;
  auto refused = [&](tTileSet ts, tTileSetCalibration tsc) {
    const bool result = streams().Stream_TileSetCalibration(kTo, stream, pos, ts, tsc);
    EXPECT_EQ(contents(stream), Bytes{7});
    EXPECT_EQ(pos, 1);
    return !result;
  };
  EXPECT_TRUE(refused(tile_set(0, 12, u"TS-7"), calibration(0, 12, u"ts-7")));  // letter case
  EXPECT_TRUE(refused(tTileSet{u"TS-7", {}}, calibration(0, 12)));              // no bounds
  EXPECT_TRUE(refused(tile_set(0, 12), calibration(0, 11)));                    // index 12 missing
  EXPECT_TRUE(refused(tile_set(0, 12), tTileSetCalibration{u"TS-7", {}, 0, {}}));
  EXPECT_TRUE(refused(tile_set(0, 254), calibration(0, 254)));  // 255 tiles: unreadable
  EXPECT_TRUE(refused(tile_set(1, 255), calibration(1, 255)));  // beyond the 8-bit counter
  EXPECT_TRUE(refused(tile_set(-1, 3), calibration(-1, 3)));
  EXPECT_TRUE(refused(tile_set(5, 4), calibration(5, 4)));  // no tiles: unreadable
  tTileSet two_ranks{u"TS-7", Array<tTileDef>({{1, 2}, {1, 2}})};
  EXPECT_TRUE(refused(two_ranks, calibration(1, 2)));
  EXPECT_TRUE(log.entries.empty());

  // The limits themselves are accepted.
  tTileSet largest = tile_set(1, 254);
  tTileSetCalibration largest_calibration = calibration(1, 254);
  EXPECT_TRUE(streams().Stream_TileSetCalibration(kTo, stream, pos, largest, largest_calibration));
}

// --- Profile ----------------------------------------------------------------

TEST(Streams, ProfileCarriesItsTypeNameAndInterleavedTables) {
  tOVProfile pro = profile();
  ByteArray stream(0, -1);
  Long pos = 0;
  ASSERT_TRUE(streams().Stream_Profile(kTo, stream, pos, pro));
  const tOVProfileDataV1 t = profile_tables();
  Wire expected;
  expected.str("SN42").f64(45123.5).boolean(true).str("tOVProfileDataV1");
  for (Long k = 0; k <= 1; ++k) {
    for (Long band = 1; band <= 40; ++band) {
      expected.f32(t.wCal(k).Data(band)).f32(t.wave(k).Data(band));
      expected.f32(t.Linear(k).Data(band)).f32(t.Dark(k).Data(band));
    }
  }
  EXPECT_EQ(contents(stream), expected.bytes);
  EXPECT_EQ(pos, 8 + 8 + 1 + 20 + 1280);
}

TEST(Streams, ProfileWriterNeedsItsTables) {
  ByteArray stream(0, -1);
  Long pos = 0;
  tOVProfile pro = profile();
  pro.ProfileData = Variant();
  EXPECT_FALSE(streams().Stream_Profile(kTo, stream, pos, pro));
  pro.ProfileData = Variant(String(u"tOVProfileDataV1"));
  EXPECT_FALSE(streams().Stream_Profile(kTo, stream, pos, pro));
  EXPECT_EQ(stream.ubound(), -1);
  EXPECT_EQ(pos, 0);
}

}  // namespace
}  // namespace kvdata
