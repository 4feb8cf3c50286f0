// Bad input for the record streams beyond tests/data/cut-streams.txt (which
// has streams cut or changed and Positions outside them): writers below the
// stream, test-run series of other bounds or ranks, and the largest tile count.

#include <gtest/gtest.h>

#include <functional>
#include <vector>

#include "kvdata/kvdata.hpp"
#include "streams/stream_test_support.hpp"

namespace kvdata {
namespace {

using testing::LogCapture;
using testing::organization;
using testing::profile;
using testing::sc_pair;
using testing::stream_of;
using testing::user;
using testing::Wire;
using Bytes = std::vector<Byte>;

constexpr auto kTo = eStreamDirection::ToStream;
constexpr auto kFrom = eStreamDirection::FromStream;

Streams& streams() {
  return Streams::instance();
}

// Writes a sample record at Position -1 of an array of `room` bytes.
template <class R>
std::function<bool(ByteArray&, Long&)> writer(bool (Streams::*fn)(const eStreamDirection&,
                                                                  ByteArray&, Long&, R&),
                                              R sample) {
  return [=](ByteArray& s, Long& p) {
    R r = sample;
    return (streams().*fn)(kTo, s, p, r);
  };
}

TEST(BadInputPositions, WritersBelowTheStreamWriteNothing) {
  LogCapture log;
  const struct {
    const char* name;
    std::function<bool(ByteArray&, Long&)> write;
    std::size_t room;
    std::size_t entries;  // codec values log one; blocks log nothing
  } cases[] = {
      {"SC pair", writer(&Streams::Stream_SCPair, sc_pair(1)), 8, 1},
      {"station", writer(&Streams::Stream_Station, tStation{u"{4F1C}", u"Lab 2", u"x"}), 8, 1},
      {"profile", writer(&Streams::Stream_Profile, profile()), 8, 1},
      {"user block", writer(&Streams::Stream_User, user()), 261, 0},
      {"organization", writer(&Streams::Stream_Organization, organization()), 133, 0},
  };
  for (const auto& c : cases) {
    log.entries.clear();
    ByteArray s = stream_of(Bytes(c.room, 0x5A));
    const ByteArray before = s;
    Long p = -1;
    EXPECT_FALSE(c.write(s, p)) << c.name;
    EXPECT_EQ(s, before) << c.name;
    EXPECT_EQ(p, -1) << c.name;
    EXPECT_EQ(log.entries.size(), c.entries) << c.name;
  }
}

// 254 tiles is the most the stream carries, and it reads in full; the
// counts refused are rows of tests/data/cut-streams.txt.
TEST(BadInputHostileCounts, TileCountsAtTheEightBitLimit) {
  Wire w;
  w.str("TS").l32(254);
  for (int i = 0; i < 254; ++i) w.str("").l32(0).zeros(160);
  w.f64(1.0).f32(2.0f).zeros(254 * 320);
  ByteArray s = stream_of(w.bytes);
  tTileSet ts;
  tTileSetCalibration tsc;
  Long p = 0;
  ASSERT_TRUE(streams().Stream_TileSetCalibration(kFrom, s, p, ts, tsc));
  EXPECT_EQ(ts.Tiles.lbound(), 1);
  EXPECT_EQ(ts.Tiles.ubound(), 254);
  EXPECT_EQ(tsc.Tiles.ubound(), 254);
  EXPECT_EQ(p, static_cast<Long>(s.size()));
}

TEST(BadInputArrays, TestRunSeriesWithOtherBoundsOrRanks) {
  LogCapture log;
  // Test-run series with tiles -2..0 come back as 1..3; a two-dimensional
  // series is refused.
  tTestRun1 tr;
  tr.IIA.Measurements(1).Tiles.redim(-2, 0);
  tr.IIA.Measurements(1).Tiles(0).Trial = sc_pair(9);
  ByteArray run(0, -1);
  Long p = 0;
  ASSERT_TRUE(streams().Stream_TestRun(kTo, run, p, tr));
  tTestRun1 run_back;
  p = 0;
  ASSERT_TRUE(streams().Stream_TestRun(kFrom, run, p, run_back));
  EXPECT_EQ(run_back.IIA.Measurements(1).Tiles.lbound(), 1);
  EXPECT_EQ(run_back.IIA.Measurements(1).Tiles(3).Trial, sc_pair(9));
  tr.IIA.Measurements(1).Tiles = Array<tIIATile>({{1, 1}, {1, 1}});
  ByteArray run_refused(0, -1);
  p = 0;
  EXPECT_FALSE(streams().Stream_TestRun(kTo, run_refused, p, tr));
  EXPECT_EQ(run_refused.ubound(), -1);
  EXPECT_TRUE(log.entries.empty());
}

}  // namespace
}  // namespace kvdata
