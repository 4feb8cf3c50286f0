// Bad input for the record streams, one group per class of fault: streams
// cut short, hostile counts, Positions outside the stream, arrays without
// bounds or with another lower bound, and wrong type names. Each case asserts the result, what
// stays unchanged, where Position ends and the event-log entries.

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

// The tile-set and test-run streams have their own truncation tests; these
// are the other record streams, cut after every byte.
TEST(BadInputTruncation, EveryRecordStreamCutShortIsFalse) {
  LogCapture log;
  for (const Case& c : cases()) {
    const Bytes full = encoding(c);
    for (std::size_t cut = 0; cut < full.size(); ++cut) {
      log.entries.clear();
      ByteArray s = stream_of(Bytes(full.begin(), full.begin() + static_cast<long>(cut)));
      const ByteArray before = s;
      Long p = 0;
      bool unchanged = false;
      EXPECT_FALSE(c.read(s, p, unchanged)) << c.name << " cut at " << cut;
      EXPECT_EQ(s, before) << c.name;
      // Blocks consume what is there; codec values stop before the one that fails.
      if (c.logs) {
        EXPECT_LE(p, static_cast<Long>(cut)) << c.name << " cut at " << cut;
      } else {
        EXPECT_EQ(p, static_cast<Long>(cut)) << c.name << " cut at " << cut;
      }
      EXPECT_EQ(log.entries.size(), c.logs ? 1u : 0u) << c.name << " cut at " << cut;
      // Blocks are taken whole or not at all; the SC pair and the station
      // store values as they come, so only a cut before the first value
      // leaves them untouched.
      if (!c.logs || cut < 4) {
        EXPECT_TRUE(unchanged) << c.name << " cut at " << cut;
      }
    }
    // The whole stream reads.
    ByteArray s = stream_of(full);
    Long p = 0;
    bool unchanged = true;
    EXPECT_TRUE(c.read(s, p, unchanged)) << c.name;
    EXPECT_EQ(p, static_cast<Long>(full.size())) << c.name;
    EXPECT_FALSE(unchanged) << c.name;
  }
}

TEST(BadInputTruncation, ProfileTablesCutAnywhereKeepTheOldTables) {
  // Every cut inside the 320 table values: the header is replaced, the
  // tables are not, and the one entry names the value that failed.
  LogCapture log;
  ByteArray full(0, -1);
  Long end = 0;
  tOVProfile written = profile();
  ASSERT_TRUE(streams().Stream_Profile(kTo, full, end, written));
  const Long tables_at = end - 320 * 4;
  const Bytes bytes = contents(full);
  for (Long cut = tables_at; cut < end; cut += 3) {
    log.entries.clear();
    ByteArray s = stream_of(Bytes(bytes.begin(), bytes.begin() + cut));
    tOVProfile pro;
    pro.ProfileData = Variant(String(u"old"));
    Long p = 0;
    EXPECT_FALSE(streams().Stream_Profile(kFrom, s, p, pro));
    EXPECT_EQ(pro.ISN, u"SN42");
    EXPECT_EQ(pro.ProfileData, Variant(String(u"old")));
    EXPECT_EQ(p, tables_at + (cut - tables_at) / 4 * 4);
    ASSERT_EQ(log.entries.size(), 1u);
    EXPECT_EQ(log.entries[0].rfind(u"Error in SUB SingleFromArray - Value = 0. ", 0), 0u);
  }
}

TEST(BadInputHostileCounts, StringCountsNearTheLimitsAreRefusedBeforeAllocating) {
  LogCapture log;
  // A station whose first count is hostile, with 300 bytes after it.
  for (const std::int64_t count :
       std::vector<std::int64_t>{301, 65535, 65536, 100000, 1 << 30, kLongMax - 3, kLongMax, -1,
                                 -256, -65536, static_cast<std::int64_t>(kLongMin)}) {
    log.entries.clear();
    Wire w;
    w.l32(static_cast<std::int32_t>(count)).zeros(300);
    ByteArray s = stream_of(w.bytes);
    tStation st{u"a", u"b", u"c"};
    Long p = 0;
    testing::reset_largest_allocation();
    EXPECT_FALSE(streams().Stream_Station(kFrom, s, p, st)) << count;
    EXPECT_LT(testing::largest_allocation(), 4096u) << count;
    EXPECT_EQ(st, (tStation{u"a", u"b", u"c"})) << count;
    EXPECT_EQ(p, 4) << count;
    ASSERT_EQ(log.entries.size(), 1u) << count;
    EXPECT_NE(
        log.entries[0].find(u"String Size = " + Variant(static_cast<Long>(count)).to_string()),
        String::npos);
  }
  // Counts at the 8-bit edge and one that takes every byte left: the text
  // is read, and the next count is the one that runs out (and reads as empty).
  for (const std::int32_t count : {255, 256, 300}) {
    log.entries.clear();
    Wire w;
    w.l32(count);
    w.bytes.insert(w.bytes.end(), static_cast<std::size_t>(count), Byte{'x'});
    ByteArray s = stream_of(w.bytes);
    tStation st{u"a", u"b", u"c"};
    Long p = 0;
    EXPECT_FALSE(streams().Stream_Station(kFrom, s, p, st)) << count;
    EXPECT_EQ(st, (tStation{String(static_cast<std::size_t>(count), u'x'), u"", u"c"})) << count;
    EXPECT_EQ(p, 4 + count) << count;
    EXPECT_EQ(log.entries.size(), 1u) << count;
  }
}

TEST(BadInputHostileCounts, TileCountsAtTheEightBitLimit) {
  LogCapture log;
  // 254 tiles is the most the stream carries, and it reads in full.
  const auto stream_with = [](std::int32_t count, std::size_t tiles) {
    Wire w;
    w.str("TS").l32(count);
    for (std::size_t i = 0; i < tiles; ++i) w.str("").l32(0).zeros(160);
    w.f64(1.0).f32(2.0f).zeros(tiles * 320);
    return w.bytes;
  };
  ByteArray s = stream_of(stream_with(254, 254));
  tTileSet ts;
  tTileSetCalibration tsc;
  Long p = 0;
  ASSERT_TRUE(streams().Stream_TileSetCalibration(kFrom, s, p, ts, tsc));
  EXPECT_EQ(ts.Tiles.lbound(), 1);
  EXPECT_EQ(ts.Tiles.ubound(), 254);
  EXPECT_EQ(tsc.Tiles.ubound(), 254);
  EXPECT_EQ(p, static_cast<Long>(s.size()));

  // One byte short, no tiles, a negative count, more tiles than the counter
  // holds (with all their bytes there) or than the bytes left: refused
  // before reading any tile, both records unchanged, nothing logged.
  const tTileSet ts_before = ts;
  const tTileSetCalibration tsc_before = tsc;
  Bytes short_one = stream_with(254, 254);
  short_one.pop_back();
  for (const Bytes& bytes :
       {short_one, stream_with(0, 0), stream_with(-3, 1), stream_with(255, 255),
        stream_with(256, 256), stream_with(65535, 1), stream_with(65536, 1),
        stream_with(0x7FFFFFFF, 1), stream_with(5, 1)}) {
    ByteArray bad = stream_of(bytes);
    p = 0;
    testing::reset_largest_allocation();
    EXPECT_FALSE(streams().Stream_TileSetCalibration(kFrom, bad, p, ts, tsc));
    EXPECT_LT(testing::largest_allocation(), 200000u);
    EXPECT_EQ(ts, ts_before);
    EXPECT_EQ(tsc, tsc_before);
  }
  EXPECT_TRUE(log.entries.empty());
}

TEST(BadInputHostileCounts, NegativeSeriesCountsGiveSeriesWithoutTiles) {
  LogCapture log;
  tTestRun1 written;
  written.IIA.TSN = u"TS";
  ByteArray full(0, -1);
  Long end = 0;
  ASSERT_TRUE(streams().Stream_TestRun(kTo, full, end, written));
  // The last two bytes are the only series' tile count.
  for (const std::int16_t count : {std::int16_t{-1}, std::int16_t{-32768}}) {
    ByteArray s = full;
    s(end - 2) = static_cast<Byte>(count & 0xFF);
    s(end - 1) = static_cast<Byte>((count >> 8) & 0xFF);
    tTestRun1 tr;
    tr.Comment = u"old";
    Long p = 0;
    ASSERT_TRUE(streams().Stream_TestRun(kFrom, s, p, tr)) << count;
    EXPECT_EQ(p, end);
    EXPECT_FALSE(tr.IIA.Measurements(1).Tiles.has_bounds());
    EXPECT_EQ(tr.Comment, u"");
  }
  // A count that needs one byte more than there is.
  ByteArray s = full;
  s(end - 2) = 1;
  s.redim_preserve(0, end - 1 + 639);
  tTestRun1 tr;
  tr.Comment = u"old";
  Long p = 0;
  EXPECT_FALSE(streams().Stream_TestRun(kFrom, s, p, tr));
  EXPECT_EQ(tr.Comment, u"old");
  EXPECT_EQ(p, end);
  EXPECT_TRUE(log.entries.empty());
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

TEST(BadInputTypeNames, ProfileTablesOfAnyOtherNameAreRefused) {
  LogCapture log;
  const std::vector<std::string> names = {"tOVProfileDataV2",
                                          "tovprofiledatav1",
                                          "TOVPROFILEDATAV1",
                                          "tOVProfileDataV1 ",
                                          " tOVProfileDataV1",
                                          "tOVProfileData",
                                          std::string("tOVProfileDataV1\0", 17),
                                          ""};
  for (const std::string& name : names) {
    Wire w;
    w.str("NEW").f64(7.0).boolean(true).str(name);
    const std::size_t header = w.size();
    for (int k = 0; k < 320; ++k) w.f32(1.0f);
    ByteArray s = stream_of(w.bytes);
    tOVProfile pro;
    pro.ProfileData = Variant(String(u"old"));
    Long p = 0;
    EXPECT_FALSE(streams().Stream_Profile(kFrom, s, p, pro)) << name;
    EXPECT_EQ(pro.ISN, u"NEW") << name;  // the header is stored before the check
    EXPECT_EQ(pro.Created, Date{7.0}) << name;
    EXPECT_TRUE(pro.Validated) << name;
    EXPECT_EQ(pro.ProfileData, Variant(String(u"old"))) << name;
    EXPECT_EQ(p, static_cast<Long>(header)) << name;
  }
  EXPECT_TRUE(log.entries.empty());
}

}  // namespace
}  // namespace kvdata
