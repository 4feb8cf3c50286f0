// Text beyond Windows-1252 in the objects' streams (streams cut short or
// changed, Positions outside them: tests/data/cut-streams.txt).

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

std::shared_ptr<KVTolerance> tolerance(Long id, const String& name = u"T") {
  auto tol = KVTolerance::create();
  tol->ID(id);
  tol->TolName(name);
  tol->MaxFail(1.5);
  return tol;
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
