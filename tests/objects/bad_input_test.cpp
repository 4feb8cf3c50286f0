// Bad input for the objects' own streams beyond tests/data/cut-streams.txt
// (streams cut short, other stamps, hostile member counts, repeated member
// IDs): Positions outside the stream, arrays without bounds, and text beyond
// Windows-1252. Each case asserts the result, what stays unchanged, where
// Position ends and the event-log entries.

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <limits>
#include <vector>

#include "kvdata/kvdata.hpp"
#include "support/streams.hpp"

namespace {

using kvdata::Byte;
using kvdata::ByteArray;
using kvdata::Date;
using kvdata::IKVCalibration;
using kvdata::IKVTileSet;
using kvdata::IKVTolerance;
using kvdata::IKVTolSet;
using kvdata::Integer;
using kvdata::KVCalibration;
using kvdata::KVCalTile;
using kvdata::KVTile;
using kvdata::KVTileSet;
using kvdata::KVTolerance;
using kvdata::KVTolSet;
using kvdata::KVUser;
using kvdata::Long;
using kvdata::String;
using kvdata::tTileSet;
using kvdata::tUser;
using kvdata::Variant;
using kvdata::testing::encoding;
using kvdata::testing::LogCapture;
using kvdata::testing::prefix;
using kvdata::testing::stream_of;

constexpr Long kLongMin = std::numeric_limits<Long>::min();
constexpr Long kLongMax = std::numeric_limits<Long>::max();
constexpr char16_t kTooSmall[] = u"Stream is too small to contain user structure";
constexpr char16_t kOtherVersion[] = u"Client and Server KVData.DLL versions don't match";

tUser sample_user() {
  tUser u;
  u.USERID = u"ANN";
  u.UserNumber = 12;
  u.LastName = u"Smith";
  u.OrgID = 3;
  u.RoleCode = u"A";
  u.Disabled = u"N";
  return u;
}

std::shared_ptr<KVUser> user_with(const String& id) {
  auto user = KVUser::create();
  tUser u;
  u.USERID = id;
  user->v1User(u);
  return user;
}

std::shared_ptr<KVTolerance> tolerance(Long id, const String& name = u"T") {
  auto tol = KVTolerance::create();
  tol->ID(id);
  tol->TolName(name);
  tol->MaxFail(1.5);
  return tol;
}

// A set with header ID 7 and InstTypeID 3 holding tolerances with `ids`.
std::shared_ptr<KVTolSet> set_of(const std::vector<Long>& ids) {
  auto set = KVTolSet::create();
  IKVTolSet& s = *set;
  s.ID(7);
  s.InstTypeID(3);
  for (const Long id : ids) s.Add(tolerance(id), Variant(id).to_string());
  return set;
}

// A tile set of 13 named tiles, TSN "TS01".
std::shared_ptr<KVTileSet> tile_set() {
  auto set = KVTileSet::create();
  IKVTileSet& s = *set;
  s.TSN(u"TS01");
  for (Integer i = 1; i <= 13; ++i) {
    auto tile = KVTile::create();
    tile->ColorName(u"T" + Variant(i).to_string());
    tile->ColorRGB(i);
    s.Tiles(i, tile);
  }
  return set;
}

std::shared_ptr<KVCalibration> calibration() {
  auto cal = KVCalibration::create();
  IKVCalibration& c = *cal;
  c.TSN(u"TS01");
  c.DateCertified(Date{44500.0});
  c.TempCalibrated(23.0f);
  auto tile = KVCalTile::create();
  tile->SCWL(kvdata::eSC::SCI, 40, 87.5);
  c.Tiles(13, tile);
  return cal;
}

TEST(ObjectBadInputPositions, ReadersOutsideTheStreamKeepTheirState) {
  auto written = KVUser::create();
  written->v1User(sample_user());
  ByteArray user_stream(0, -1);
  ASSERT_TRUE(written->StreamOut(user_stream));
  const auto tol_bytes = encoding(*tolerance(5));
  const auto set_bytes = encoding(*set_of({5}));
  const ByteArray tol_stream = stream_of(tol_bytes);
  const ByteArray set_stream = stream_of(set_bytes);

  const ByteArray tile_stream =
      stream_of(encoding(*kvdata::query<kvdata::IKVStream>(tile_set()->Tiles(1))));
  const ByteArray cal_stream = stream_of(encoding(*calibration()));
  const ByteArray tile_set_stream = stream_of(encoding(*tile_set()));
  for (const Long position : {-1, -264, -749, kLongMin, kLongMax - 100, kLongMax}) {
    LogCapture log;
    // User: a Position below the array passes the length check but its
    // stamp cannot be read (one entry, the stamp counts as 0); past the
    // array's end, the length check refuses it.
    auto user = user_with(u"OLD");
    Long p = position;
    EXPECT_FALSE(user->StreamIn(user_stream, p)) << position;
    EXPECT_EQ(p, position);
    EXPECT_EQ(user->v1User().USERID, u"OLD");
    if (position < 0) {
      EXPECT_EQ(user->ErrMsg(), kOtherVersion) << position;
    } else {
      EXPECT_EQ(user->ErrMsg(), kTooSmall) << position;
    }

    auto tol = tolerance(77, u"OLD");
    p = position;
    EXPECT_FALSE(tol->StreamIn(tol_stream, p)) << position;
    EXPECT_EQ(p, position);
    EXPECT_EQ(tol->ID(), 77);

    // The set removes its members before it reads; its header stays.
    auto set = set_of({1, 2});
    p = position;
    EXPECT_FALSE(set->StreamIn(set_stream, p)) << position;
    EXPECT_EQ(p, position);
    EXPECT_EQ(set->count(), 0);
    EXPECT_EQ(set->InstTypeID(), 3);

    auto tile = KVTile::create();
    tile->ColorRGB(9);
    p = position;
    EXPECT_FALSE(tile->StreamIn(tile_stream, p)) << position;
    EXPECT_EQ(p, position);
    EXPECT_EQ(tile->ColorRGB(), 9);

    auto cal = KVCalibration::create();
    cal->TempCalibrated(9.0f);
    p = position;
    EXPECT_FALSE(cal->StreamIn(cal_stream, p)) << position;
    EXPECT_EQ(p, position);
    EXPECT_EQ(cal->TempCalibrated(), 9.0f);

    // The tile set's TSN is a codec field: its one entry, nothing replaced.
    auto tiles = tile_set();
    tiles->TSN(u"OLD");
    p = position;
    EXPECT_FALSE(tiles->StreamIn(tile_set_stream, p)) << position;
    EXPECT_EQ(p, position);
    EXPECT_EQ(tiles->TSN(), u"OLD");
    EXPECT_EQ(log.entries.size(), position < 0 ? 2u : 1u) << position;  // the user's and the TSN's
  }
}

// Reading from a stream loaded from a file (lower bound 1) is in
// tests/data/cut-streams.txt; here, an array without bounds and index 0 of
// a loaded one.
TEST(ObjectBadInputArrays, StreamsWithoutBoundsOrReadBelowTheLowerBound) {
  LogCapture log;
  auto tol = tolerance(77, u"OLD");
  Long p = 0;
  EXPECT_FALSE(tol->StreamIn(ByteArray(), p));
  EXPECT_EQ(p, 0);
  EXPECT_EQ(tol->ID(), 77);
  auto set = set_of({1});
  set->InstTypeID(99);
  EXPECT_FALSE(set->StreamIn(ByteArray(), p));
  EXPECT_EQ(p, 0);
  EXPECT_EQ(set->count(), 0);
  EXPECT_EQ(set->InstTypeID(), 99);
  ByteArray loaded = stream_of(encoding(*set_of({5, 9})), 1);
  EXPECT_FALSE(set->StreamIn(loaded, p));
  EXPECT_EQ(p, 0);
  EXPECT_EQ(set->count(), 0);
  EXPECT_TRUE(log.entries.empty());
}

TEST(ObjectBadInputText, FixedWidthTextCarriesAnyCodeUnitAndCutsByUnits) {
  // CJK, a surrogate pair and a lone surrogate travel as the UTF-16 units
  // they are; nothing is replaced by '?' in the objects' fixed-width blocks.
  const String cjk = u"\u65E5\u672C\u8A9E";
  const String emoji = u"x\U0001F600";
  const String lone = String(u"a") + char16_t{0xDC00} + u"b";
  auto tol = tolerance(1, cjk);
  tol->Description(emoji);
  tol->Misc(lone);
  auto back = KVTolerance::create();
  ByteArray s(0, -1);
  ASSERT_TRUE(tol->StreamOut(s));
  ASSERT_TRUE(back->StreamIn(s));
  EXPECT_EQ(back->TolName(), cjk);
  EXPECT_EQ(back->Description(), emoji);
  EXPECT_EQ(back->Misc(), lone);

  // A 50-unit field cuts a surrogate pair that straddles its end: its high
  // half is kept alone.
  tol->TolName(String(49, u'a') + u"\U0001F600");
  ASSERT_TRUE(tol->StreamOut(s));
  ASSERT_TRUE(back->StreamIn(s));
  EXPECT_EQ(back->TolName(), String(49, u'a') + char16_t{0xD83D});

  tUser u = sample_user();
  u.LastName = cjk + emoji;
  u.Disabled = lone.substr(1, 1);
  auto user = KVUser::create();
  user->v1User(u);
  ByteArray us(0, -1);
  ASSERT_TRUE(user->StreamOut(us));
  auto user_back = KVUser::create();
  ASSERT_TRUE(user_back->StreamIn(us));
  EXPECT_EQ(user_back->v1User(), u);

  // The tile set's TSN goes through the codec: characters Windows-1252
  // lacks come back as '?'; tile names are fixed-width UTF-16 and come back
  // as they were.
  auto set = tile_set();
  set->TSN(u"TS\u00E9\u65E5\U0001F600");
  auto named = KVTile::create();
  named->ColorName(u"\u65E5\xD800");
  set->Tiles(2, named);
  ByteArray ts(0, -1);
  ASSERT_TRUE(set->StreamOut(ts));
  auto back_set = KVTileSet::create();
  Long p = 0;
  ASSERT_TRUE(back_set->StreamIn(ts, p));
  EXPECT_EQ(back_set->TSN(), u"TS\u00E9??");
  EXPECT_EQ(back_set->Tiles(2)->ColorName(), u"\u65E5\xD800");
  EXPECT_EQ(p, 4 + 5 + 13 * 264);
}

}  // namespace
