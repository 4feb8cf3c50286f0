// Bad input for the objects' own streams (user, tolerance, tolerance set),
// one group per class of fault: streams cut short, Positions outside the
// stream, arrays without bounds or with another lower bound, wrong stamps,
// repeated member IDs, hostile member counts, and text beyond Windows-1252.
// Each case asserts the result, what stays unchanged, where Position ends
// and the event-log entries.

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

std::vector<Long> member_ids(const KVTolSet& set) {
  std::vector<Long> ids;
  for (const auto& member : set) ids.push_back(member->ID());
  return ids;
}

// The little-endian member count of a set stream, at offset 528.
void set_count(std::vector<Byte>& bytes, std::int32_t count) {
  for (int i = 0; i < 4; ++i) {
    bytes[528 + static_cast<std::size_t>(i)] =
        static_cast<Byte>(static_cast<std::uint32_t>(count) >> (8 * i));
  }
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

TEST(ObjectBadInputTruncation, EveryObjectStreamCutShortIsRefused) {
  LogCapture log;
  // User: every array shorter than 849 elements (the 848 bytes and the
  // spare one) is refused before anything is read.
  auto written = KVUser::create();
  written->v1User(sample_user());
  ByteArray user_stream(0, -1);
  ASSERT_TRUE(written->StreamOut(user_stream));
  const std::vector<Byte> user_bytes(user_stream.begin(), user_stream.end());
  ASSERT_EQ(user_bytes.size(), 849u);
  for (std::size_t cut = 0; cut < user_bytes.size(); ++cut) {
    auto user = user_with(u"OLD");
    ByteArray s = stream_of(prefix(user_bytes, cut));
    Long p = 0;
    EXPECT_FALSE(user->StreamIn(s, p)) << cut;
    EXPECT_EQ(p, 0) << cut;
    EXPECT_EQ(user->v1User().USERID, u"OLD") << cut;
    EXPECT_EQ(user->ErrMsg(), kTooSmall) << cut;
  }

  // Tolerance: Position moves past the bytes there were; the record stays.
  auto tol_written = tolerance(5);
  const std::vector<Byte> tol_bytes = encoding(*tol_written);
  ASSERT_EQ(tol_bytes.size(), 749u);
  for (std::size_t cut = 0; cut < tol_bytes.size(); ++cut) {
    auto tol = tolerance(77, u"OLD");
    ByteArray s = stream_of(prefix(tol_bytes, cut));
    Long p = 0;
    EXPECT_FALSE(tol->StreamIn(s, p)) << cut;
    EXPECT_EQ(p, static_cast<Long>(cut));
    EXPECT_EQ(tol->ID(), 77) << cut;
    EXPECT_EQ(tol->TolName(), u"OLD") << cut;
  }

  // Tolerance set: the members are removed first; the header is kept once
  // all of it was read, and whole members are kept as they come.
  auto set_written = set_of({5, 9});
  const std::vector<Byte> set_bytes = encoding(*set_written);
  ASSERT_EQ(set_bytes.size(), 533u + 2 * 749u);
  for (std::size_t cut = 0; cut < set_bytes.size(); ++cut) {
    auto set = set_of({1});
    IKVTolSet& s = *set;
    s.InstTypeID(99);
    ByteArray stream = stream_of(prefix(set_bytes, cut));
    Long p = 0;
    EXPECT_FALSE(set->StreamIn(stream, p)) << cut;
    EXPECT_EQ(p, static_cast<Long>(cut));
    EXPECT_EQ(s.InstTypeID(), cut < 533 ? 99 : 3) << cut;
    const std::size_t whole = cut < 533 ? 0 : (cut - 533) / 749;
    std::vector<Long> ids{5, 9};
    ids.resize(whole);
    EXPECT_EQ(member_ids(*set), ids) << cut;
  }
  EXPECT_TRUE(log.entries.empty());
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

TEST(ObjectBadInputArrays, StreamsWithoutBoundsOrAnotherLowerBound) {
  LogCapture log;
  // Without bounds.
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
  EXPECT_TRUE(log.entries.empty());

  // A loaded stream (lower bound 1) and one from -7: read from the lower
  // bound they decode whole; from index 0 of the loaded one, nothing.
  const auto tol_bytes = encoding(*tolerance(5, u"FIVE"));
  const auto set_bytes = encoding(*set_of({5, 9}));
  for (const Long lower : {1, -7}) {
    ByteArray s = stream_of(tol_bytes, lower);
    p = lower;
    ASSERT_TRUE(tol->StreamIn(s, p)) << lower;
    EXPECT_EQ(p, lower + 749);
    EXPECT_EQ(tol->TolName(), u"FIVE");
    ByteArray t = stream_of(set_bytes, lower);
    p = lower;
    ASSERT_TRUE(set->StreamIn(t, p)) << lower;
    EXPECT_EQ(p, lower + 533 + 2 * 749);
    EXPECT_EQ(member_ids(*set), (std::vector<Long>{5, 9}));
  }
  ByteArray loaded = stream_of(set_bytes, 1);
  p = 0;
  EXPECT_FALSE(set->StreamIn(loaded, p));
  EXPECT_EQ(p, 0);
  EXPECT_EQ(set->count(), 0);
  EXPECT_TRUE(log.entries.empty());
}

TEST(ObjectBadInputStamps, OnlyTheSingleOnePointTwoIsAUserStream) {
  LogCapture log;
  auto written = KVUser::create();
  written->v1User(sample_user());
  ByteArray good(0, -1);
  ASSERT_TRUE(written->StreamOut(good));
  const float stamps[] = {1.4f,
                          -1.2f,
                          0.0f,
                          std::nextafter(1.2f, 2.0f),
                          std::nextafter(1.2f, 0.0f),
                          std::numeric_limits<float>::quiet_NaN(),
                          std::numeric_limits<float>::infinity()};
  for (const float stamp : stamps) {
    ByteArray s = good;
    Long p = 0;
    kvdata::SingleToArray(stamp, s, p);
    auto user = user_with(u"OLD");
    p = 0;
    EXPECT_FALSE(user->StreamIn(s, p)) << stamp;
    EXPECT_EQ(p, 4) << stamp;  // past the stamp that was read
    EXPECT_EQ(user->ErrMsg(), kOtherVersion) << stamp;
    EXPECT_EQ(user->v1User().USERID, u"OLD");
  }
  // The Double 1.2 is no Single 1.2 either: its low four bytes are read.
  ByteArray s = good;
  Long p = 0;
  kvdata::DateToArray(Date{1.2}, s, p);
  auto user = user_with(u"OLD");
  p = 0;
  EXPECT_FALSE(user->StreamIn(s, p));
  EXPECT_EQ(user->ErrMsg(), kOtherVersion);
  EXPECT_TRUE(log.entries.empty());
}

TEST(ObjectBadInputDuplicateKeys, RepeatedMemberIdsStopTheRead) {
  // Members 5, 9, 5: the third one is refused, the first two stay, and
  // Position is past the refused member.
  auto three = set_of({5, 9, 6});
  std::vector<Byte> bytes = encoding(*three);
  bytes[533 + 2 * 749] = 5;  // the third ID, low byte
  auto set = KVTolSet::create();
  ByteArray s = stream_of(bytes);
  Long p = 0;
  EXPECT_FALSE(set->StreamIn(s, p));
  EXPECT_EQ(member_ids(*set), (std::vector<Long>{5, 9}));
  EXPECT_EQ(p, 533 + 3 * 749);
  // The set is usable afterwards and writes what it holds.
  const auto again = encoding(*set);
  EXPECT_EQ(again.size(), 533u + 2 * 749u);
  EXPECT_EQ(again[528], 2);

  // Two members with ID 0 (never set): the second is refused.
  auto zeros = set_of({1, 2});
  bytes = encoding(*zeros);
  bytes[533] = 0;
  bytes[533 + 749] = 0;
  s = stream_of(bytes);
  p = 0;
  EXPECT_FALSE(set->StreamIn(s, p));
  EXPECT_EQ(member_ids(*set), (std::vector<Long>{0}));

  // -5 and 5 are different keys.
  auto signs = set_of({-5, 5});
  bytes = encoding(*signs);
  s = stream_of(bytes);
  p = 0;
  ASSERT_TRUE(set->StreamIn(s, p));
  IKVTolSet& read = *set;
  EXPECT_EQ(read.Item(Variant(String(u"-5")))->ID(), -5);
  EXPECT_EQ(read.Item(Variant(Long{5}))->ID(), 5);
}

TEST(ObjectBadInputHostileCounts, MemberCountsNearTheLimits) {
  LogCapture log;
  const std::vector<Byte> bytes = encoding(*set_of({5, 9}));
  // Counts beyond the two members there are: both are read, then the
  // stream runs out.
  for (const std::int32_t count : {3, 255, 256, 65535, 65536, 0x7FFFFFFF}) {
    std::vector<Byte> hostile = bytes;
    set_count(hostile, count);
    auto set = KVTolSet::create();
    ByteArray s = stream_of(hostile);
    Long p = 0;
    EXPECT_FALSE(set->StreamIn(s, p)) << count;
    EXPECT_EQ(member_ids(*set), (std::vector<Long>{5, 9})) << count;
    EXPECT_EQ(p, static_cast<Long>(bytes.size())) << count;
  }
  // Counts of 0 or less: no members, True after the header.
  for (const std::int32_t count : {0, -1, -256, std::numeric_limits<std::int32_t>::min()}) {
    std::vector<Byte> none = bytes;
    set_count(none, count);
    auto set = set_of({1});
    ByteArray s = stream_of(none);
    Long p = 0;
    EXPECT_TRUE(set->StreamIn(s, p)) << count;
    EXPECT_EQ(set->count(), 0) << count;
    EXPECT_EQ(p, 533) << count;
  }
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

TEST(ObjectBadInputTruncation, TileStreamsCutShort) {
  LogCapture log;
  // Tile and calibration blocks: every cut is refused, the object stays,
  // and Position moves past the bytes there were.
  const auto tile_bytes = encoding(*kvdata::query<kvdata::IKVStream>(tile_set()->Tiles(5)));
  ASSERT_EQ(tile_bytes.size(), 264u);
  for (std::size_t cut = 0; cut < tile_bytes.size(); ++cut) {
    auto tile = KVTile::create();
    tile->ColorName(u"OLD");
    ByteArray s = stream_of(prefix(tile_bytes, cut));
    Long p = 0;
    EXPECT_FALSE(tile->StreamIn(s, p)) << cut;
    EXPECT_EQ(p, static_cast<Long>(cut));
    EXPECT_EQ(tile->ColorName(), u"OLD") << cut;
  }
  const auto cal_bytes = encoding(*calibration());
  ASSERT_EQ(cal_bytes.size(), 4188u);
  for (std::size_t cut = 0; cut < cal_bytes.size(); ++cut) {
    auto cal = KVCalibration::create();
    cal->TSN(u"OLD");
    ByteArray s = stream_of(prefix(cal_bytes, cut));
    Long p = 0;
    EXPECT_FALSE(cal->StreamIn(s, p)) << cut;
    EXPECT_EQ(p, static_cast<Long>(cut));
    EXPECT_EQ(cal->TSN(), u"OLD     ") << cut;
    EXPECT_EQ(cal->Tiles(13)->SCWL(kvdata::eSC::SCI, 40), 0.0) << cut;
  }

  // Tile set: a cut inside the TSN field keeps the TSN (one entry, from the
  // codec); a cut inside tile block t keeps tiles t to 13 and replaces the
  // ones before it.
  const auto set_bytes = encoding(*tile_set());
  ASSERT_EQ(set_bytes.size(), 8u + 13u * 264u);
  for (std::size_t cut = 0; cut < set_bytes.size(); ++cut) {
    log.entries.clear();
    auto set = KVTileSet::create();
    set->TSN(u"OLD");
    ByteArray s = stream_of(prefix(set_bytes, cut));
    Long p = 0;
    EXPECT_FALSE(set->StreamIn(s, p)) << cut;
    const tTileSet read = set->v1TileSet();
    if (cut < 8) {
      EXPECT_EQ(read.TSN, u"OLD") << cut;
      EXPECT_EQ(log.entries.size(), 1u) << cut;
      EXPECT_EQ(p, cut < 4 ? 0 : 4) << cut;
      continue;
    }
    EXPECT_TRUE(log.entries.empty()) << cut;
    EXPECT_EQ(p, static_cast<Long>(cut));
    EXPECT_EQ(read.TSN, u"TS01");
    const std::size_t whole = (cut - 8) / 264;
    for (Long i = 1; i <= 13; ++i) {
      EXPECT_EQ(read.Tiles(i).ColorRGB, static_cast<std::size_t>(i) <= whole ? i : 0)
          << cut << " tile " << i;
    }
  }
}

}  // namespace
