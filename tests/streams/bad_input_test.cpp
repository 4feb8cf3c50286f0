// Bad input for the record streams beyond tests/data/cut-streams.txt:
// Positions outside the stream, arrays without bounds or with another lower
// bound or rank, and the largest tile count. Each case asserts the result,
// what stays unchanged, where Position ends and the event-log entries.

#include <gtest/gtest.h>

#include <cstdint>
#include <functional>
#include <limits>
#include <string>
#include <vector>

#include "kvdata/kvdata.hpp"
#include "streams/stream_test_support.hpp"

namespace kvdata {
namespace {

using testing::contents;
using testing::LogCapture;
using testing::organization;
using testing::profile;
using testing::sc_pair;
using testing::spectrum;
using testing::stream_of;
using testing::user;
using testing::Wire;
using Bytes = std::vector<Byte>;

constexpr auto kTo = eStreamDirection::ToStream;
constexpr auto kFrom = eStreamDirection::FromStream;
constexpr Long kLongMin = std::numeric_limits<Long>::min();
constexpr Long kLongMax = std::numeric_limits<Long>::max();

Streams& streams() {
  return Streams::instance();
}

tStation station() {
  return tStation{u"{4F1C}", u"Lab 2", u"lab2@example.org"};
}

// One record stream under test: how to write a sample and how to read into
// a record in a known state, with what the reader promises about that record.
struct Case {
  const char* name;
  // Writes the sample record at Position of `s`.
  std::function<bool(ByteArray& s, Long& p)> write;
  // Reads into a record in a known state; `unchanged` tells whether that
  // record (or, for readers that store values directly, the part they
  // replace only as a whole) is still as it was.
  std::function<bool(ByteArray& s, Long& p, bool& unchanged)> read;
  // Room a fixed-size block needs to be written (0: the writer grows the stream).
  Long block = 0;
  // Failures are found by the field codec, one entry each (blocks log nothing).
  bool logs = true;
};

// A case for a record stream `fn`: writes `sample`, reads into a copy of
// `before`, and `unchanged` tells whether that copy is still as it was.
template <class R>
Case record_case(const char* name,
                 bool (Streams::*fn)(const eStreamDirection&, ByteArray&, Long&, R&), R sample,
                 R before, std::function<bool(const R&)> unchanged, Long block = 0,
                 bool logs = true) {
  return {name,
          [=](ByteArray& s, Long& p) {
            R r = sample;
            return (streams().*fn)(kTo, s, p, r);
          },
          [=](ByteArray& s, Long& p, bool& same) {
            R r = before;
            const bool ok = (streams().*fn)(kFrom, s, p, r);
            same = unchanged(r);
            return ok;
          },
          block, logs};
}

template <class R>
std::function<bool(const R&)> equals(R before) {
  return [before](const R& r) { return r == before; };
}

std::vector<Case> cases() {
  tOVProfile old_tables;
  old_tables.ProfileData = Variant(String(u"old"));
  tUser old_user;
  old_user.USERID = u"OLD";
  tOrganization old_org;
  old_org.Alias = u"OLD";
  return {// Values are stored as they are read: the first one decides whether
          // anything changed.
          record_case<tSCPair>("SC pair", &Streams::Stream_SCPair, sc_pair(1), sc_pair(7),
                               [](const tSCPair& r) {
                                 return r.Spectrum(eSC::SCE).Data(1) ==
                                        sc_pair(7).Spectrum(eSC::SCE).Data(1);
                               }),
          // A first count that cannot be read empties StationGUID (the codec's
          // rule); the name after it is not attempted.
          record_case<tStation>("station", &Streams::Stream_Station, station(), {u"a", u"b", u"c"},
                                [](const tStation& r) { return r.StationName == u"b"; }),
          // The tables are replaced only when all 320 values were read.
          record_case<tOVProfile>(
              "profile", &Streams::Stream_Profile, profile(), old_tables,
              [](const tOVProfile& r) { return r.ProfileData == Variant(String(u"old")); }),
          record_case<tUser>("user block", &Streams::Stream_User, user(), old_user,
                             equals(old_user), 261, false),
          record_case<tOrganization>("organization", &Streams::Stream_Organization, organization(),
                                     old_org, equals(old_org), 133, false)};
}

// The sample's encoding from index 0.
Bytes encoding(const Case& c) {
  ByteArray s(0, c.block - 1);
  Long p = 0;
  EXPECT_TRUE(c.write(s, p)) << c.name;
  EXPECT_EQ(p, static_cast<Long>(s.size())) << c.name;
  return contents(s);
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

TEST(BadInputPositions, ReadersOutsideTheStreamOrWithoutBoundsChangeNothing) {
  LogCapture log;
  for (const Case& c : cases()) {
    const Bytes full = encoding(c);
    // The stream from index 0, from 1 (a loaded stream) and from -7, the same
    // bytes at the top of the Long range, and an array without bounds.
    ByteArray low = stream_of(full);
    ByteArray loaded = stream_of(full, 1);
    ByteArray negative = stream_of(full, -7);
    ByteArray top = stream_of(full, kLongMax - static_cast<Long>(full.size()) + 1);
    ByteArray none;
    // Read from the lower bound, the record comes back whole.
    for (ByteArray* s : {&loaded, &negative}) {
      Long p = s->lbound();
      bool unchanged = true;
      EXPECT_TRUE(c.read(*s, p, unchanged)) << c.name << " from " << s->lbound();
      EXPECT_EQ(p, s->lbound() + static_cast<Long>(full.size())) << c.name;
      EXPECT_FALSE(unchanged) << c.name;
    }
    const struct {
      ByteArray* stream;
      Long position;
    } outside[] = {
        {&low, -1},
        {&low, kLongMin},
        {&low, static_cast<Long>(full.size())},  // just past the end
        {&low, kLongMax},
        {&loaded, 0},  // one index below the lower bound
        {&negative, -8},
        {&none, 0},
        {&top, 0},
        {&top, kLongMax - 2},  // inside, but no value fits before the Long ends
        {&top, kLongMax},
    };
    for (const auto& o : outside) {
      log.entries.clear();
      const ByteArray before = *o.stream;
      Long p = o.position;
      bool unchanged = false;
      EXPECT_FALSE(c.read(*o.stream, p, unchanged)) << c.name << " at " << o.position;
      EXPECT_TRUE(unchanged) << c.name << " at " << o.position;
      EXPECT_EQ(*o.stream, before) << c.name;
      if (c.logs) {
        EXPECT_EQ(p, o.position) << c.name << " at " << o.position;
        EXPECT_EQ(log.entries.size(), 1u) << c.name << " at " << o.position;
      } else {
        // A block consumes what is there and no more.
        EXPECT_GE(p, o.position) << c.name;
        EXPECT_LE(static_cast<long long>(p) - o.position, 2) << c.name;
        EXPECT_TRUE(log.entries.empty()) << c.name;
      }
    }
  }
}

TEST(BadInputPositions, WritersBelowTheStreamWriteNothing) {
  LogCapture log;
  for (const Case& c : cases()) {
    log.entries.clear();
    ByteArray s = stream_of(Bytes(static_cast<std::size_t>(c.block > 0 ? c.block : 8), 0x5A));
    const ByteArray before = s;
    Long p = -1;
    EXPECT_FALSE(c.write(s, p)) << c.name;
    EXPECT_EQ(s, before) << c.name;
    EXPECT_EQ(p, -1) << c.name;
    EXPECT_EQ(log.entries.size(), c.logs ? 1u : 0u) << c.name;
  }
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
