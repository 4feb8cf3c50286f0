#include "kvdata/objects/kv_tile_set.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>

#include <memory>

#include "kvdata/objects/kv_tile.hpp"
#include "support/error_number.hpp"
#include "support/streams.hpp"

namespace kvdata {
namespace {

using testing::Bytes;
using testing::cat;
using testing::error_number;
using testing::LogCapture;
using testing::slice;
using testing::stream_of;
using testing::units;

// An IKVTile that is not a KVTile.
class ForeignTile : public IKVTile {
 protected:
  Integer IKVTile_Order() const override { return 1; }
  void IKVTile_Order(Integer) override {}
  String IKVTile_ColorName() const override { return u"Foreign"; }
  void IKVTile_ColorName(const String&) override {}
  Long IKVTile_ColorRGB() const override { return 1; }
  void IKVTile_ColorRGB(Long) override {}
  Double IKVTile_TempCompWL(const Integer&) const override { return 1.0; }
  void IKVTile_TempCompWL(const Integer&, const Double&) override {}
};

tTileDef tile_def(const String& name, Long rgb, Single first_band) {
  tTileDef def;
  def.Name = name;
  def.ColorRGB = rgb;
  def.TempComp.Data(1) = first_band;
  def.TempComp.Data(40) = -first_band;
  return def;
}

// A set whose 13 tiles are all different.
std::shared_ptr<KVTileSet> filled_set() {
  auto set = KVTileSet::create();
  tTileSet record;
  record.TSN = u"TS-042";
  record.Tiles.redim(1, 13);
  for (Long i = 1; i <= 13; ++i) {
    record.Tiles(i) = tile_def(u"Tile " + String(1, static_cast<char16_t>(u'A' + i)), i * 1000,
                               static_cast<Single>(i) + 0.5f);
  }
  set->v1TileSet(record);
  return set;
}

TEST(KVTileSet, TilesAreWrittenBackAtTheirOrder) {
  auto set = filled_set();
  const tTileSet before = set->v1TileSet();

  // Handing a tile out writes nothing back, even with a long name in the record.
  tTileSet with_long_name = before;
  with_long_name.Tiles(2).Name = String(60, u'N');
  set->v1TileSet(with_long_name);
  auto second = set->Tiles(2);
  EXPECT_EQ(second->ColorName(), String(50, u'N'));
  EXPECT_EQ(second->Order(), 2);
  EXPECT_EQ(set->v1TileSet().Tiles(2).Name, String(60, u'N'));
  // A let that stores nothing still writes the tile back: the name is now cut.
  second->TempCompWL(0, 9.0);
  EXPECT_EQ(set->v1TileSet().Tiles(2).Name, String(50, u'N'));
  set->v1TileSet(before);

  auto fifth = set->Tiles(5);
  EXPECT_EQ(query<KVTile>(fifth)->v1Tile(), before.Tiles(5));
  fifth->ColorRGB(0x00FF00);
  tTileSet expected = before;
  expected.Tiles(5).ColorRGB = 0x00FF00;
  EXPECT_EQ(set->v1TileSet(), expected);

  // Changing Order copies the tile to the new position; the old one keeps its data.
  auto third = set->Tiles(3);
  third->Order(6);
  expected.Tiles(6) = before.Tiles(3);
  EXPECT_EQ(set->v1TileSet(), expected);
  third->ColorName(u"  Moved  ");
  expected.Tiles(6).Name = u"Moved";
  EXPECT_EQ(set->v1TileSet(), expected);
  EXPECT_EQ(set->v1TileSet().Tiles(3), before.Tiles(3));
}

TEST(KVTileSet, TilesOutsideOneToThirteenChangeNothing) {
  auto set = filled_set();
  const tTileSet before = set->v1TileSet();
  for (const Integer idx : {Integer{0}, Integer{14}, Integer{-3}}) {
    auto tile = set->Tiles(idx);
    EXPECT_EQ(tile->Order(), idx);
    EXPECT_EQ(query<KVTile>(tile)->v1Tile(), (tTileDef{String(50, u'\0'), 0, {}}));
    tile->ColorRGB(77);
    tile->ColorName(u"Ghost");
    set->Tiles(idx, KVTile::create());
  }
  EXPECT_EQ(set->v1TileSet(), before);
}

TEST(KVTileSet, TileSetErrors) {
  auto set = filled_set();
  const tTileSet before = set->v1TileSet();

  // Not a KVTile: error 13 whatever the index; no tile at all: error 91.
  auto foreign = std::make_shared<ForeignTile>();
  EXPECT_EQ(error_number([&] { set->Tiles(3, foreign); }), kTypeMismatch);
  EXPECT_EQ(error_number([&] { set->Tiles(99, foreign); }), kTypeMismatch);
  EXPECT_EQ(error_number([&] { set->Tiles(3, nullptr); }), kObjectNotSet);
  EXPECT_EQ(set->v1TileSet(), before);

  // A replaced array with bounds 1 to 3.
  tTileSet three = before;
  three.Tiles.redim_preserve(1, 3);
  set->v1TileSet(three);
  EXPECT_EQ(set->count(), 13);
  EXPECT_EQ(set->StreamLen(), 4 + 6 + 3432);
  auto seventh = set->Tiles(7);
  EXPECT_EQ(query<KVTile>(seventh)->v1Tile().ColorRGB, 0);
  EXPECT_EQ(error_number([&] { set->Tiles(7, KVTile::create()); }), kSubscriptOutOfRange);
  // Through write-back the error reaches the caller of the tile's let.
  EXPECT_EQ(error_number([&] { seventh->ColorRGB(1); }), kSubscriptOutOfRange);
  auto first = set->Tiles(1);
  EXPECT_EQ(error_number([&] { first->Order(4); }), kSubscriptOutOfRange);
  EXPECT_EQ(set->v1TileSet(), three);

  // An array without bounds: error 9 from get and set.
  tTileSet unbounded;
  unbounded.TSN = u"U";
  set->v1TileSet(unbounded);
  EXPECT_EQ(error_number([&] { (void)set->Tiles(5); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { set->Tiles(5, KVTile::create()); }), kSubscriptOutOfRange);
  EXPECT_EQ(set->v1TileSet(), unbounded);
}

// TSN "TS1" as a codec String, then `blocks` tile blocks whose name is one
// letter (A, B, ...) and whose ColorRGB is the block's number.
Bytes tile_set_stream(int blocks) {
  Bytes out = {0x03, 0x00, 0x00, 0x00, 0x54, 0x53, 0x31};
  for (int b = 1; b <= blocks; ++b) {
    const Bytes block = cat({
        {static_cast<Byte>(0x40 + b), 0x00},
        units(0x20, 0x00, 49),
        {static_cast<Byte>(b), 0x00, 0x00, 0x00},
        Bytes(160, 0x00),
    });
    out.insert(out.end(), block.begin(), block.end());
  }
  return out;
}

// StreamIn reads the TSN, then one block per element of Tiles, whatever its
// bounds; only elements 1 to 13 are stored.
TEST(KVTileSet, StreamInReadsTsnAndOneBlockPerElement) {
  Bytes damaged = tile_set_stream(13);
  damaged[0] = 0xE8;  // a TSN count of 66536, far more than follow
  damaged[1] = 0x03;
  damaged[2] = 0x01;
  using Check = std::function<void(const tTileSet&)>;
  const struct {
    const char* name;
    bool bounded;
    Long lower, upper;
    Bytes stream;
    bool result;
    Long stop;
    std::size_t logged;
    Check check;  // nothing: the record is unchanged
  } cases[] = {
      {"1 to 3: exactly three blocks", true, 1, 3, tile_set_stream(13), true, 7 + 3 * 264, 0,
       [](const tTileSet& r) { EXPECT_EQ(r.Tiles(3).Name, u"C"); }},
      {"0 to 14: elements 0 and 14 not stored", true, 0, 14, tile_set_stream(15), true,
       7 + 15 * 264, 0,
       [](const tTileSet& r) {
         EXPECT_EQ(r.Tiles(0), tTileDef{});
         EXPECT_EQ(r.Tiles(1).Name, u"B");
         EXPECT_EQ(r.Tiles(13).Name, u"N");
         EXPECT_EQ(r.Tiles(14), tTileDef{});
       }},
      {"no bounds: the TSN, then the read fails", false, 0, 0, tile_set_stream(13), false, 7, 0,
       [](const tTileSet& r) { EXPECT_EQ(r.TSN, u"TS1"); }},
      {"1 to 50000: stops when the bytes run out", true, 1, 50000, tile_set_stream(2), false,
       7 + 2 * 264, 0, [](const tTileSet& r) { EXPECT_EQ(r.Tiles(2).Name, u"B"); }},
      // Tile indexes are Integers: elements beyond their range cannot be addressed.
      {"beyond the Integer range", true, -40000, -39999, tile_set_stream(2), false, 7, 0,
       [](const tTileSet& r) { EXPECT_EQ(r.TSN, u"TS1"); }},
      {"damaged TSN", true, 1, 13, damaged, false, 4, 1, nullptr},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.name);
    LogCapture log;
    auto set = filled_set();
    tTileSet record = set->v1TileSet();
    record.Tiles = {};
    if (c.bounded) record.Tiles.redim(c.lower, c.upper);
    for (Long i = std::max<Long>(c.lower, 1); c.bounded && i <= std::min<Long>(c.upper, 13); ++i) {
      record.Tiles(i) = set->v1TileSet().Tiles(i);
    }
    set->v1TileSet(record);
    Long position = 0;
    EXPECT_EQ(set->StreamIn(stream_of(c.stream), position), c.result);
    EXPECT_EQ(position, c.stop);
    EXPECT_EQ(log.entries.size(), c.logged);
    if (c.check) {
      c.check(set->v1TileSet());
    } else {
      EXPECT_EQ(set->v1TileSet(), record);
    }
  }
}

TEST(KVTileSet, StreamOutLayout) {
  auto set = filled_set();
  ByteArray bytes = stream_of(Bytes(5000, 0xAA));
  Long position = 3;
  ASSERT_TRUE(set->StreamOut(bytes, position));
  EXPECT_EQ(position, 3 + 4 + 6 + 13 * 264);
  EXPECT_EQ(slice(bytes, 3, 10),
            (Bytes{0x06, 0x00, 0x00, 0x00, 0x54, 0x53, 0x2D, 0x30, 0x34, 0x32}));  // "TS-042"
  // Block 1: "Tile B" padded to 50 units, ColorRGB 1000, band 1 = 1.5, band 40 = -1.5.
  EXPECT_EQ(slice(bytes, 13, 12),
            (Bytes{0x54, 0x00, 0x69, 0x00, 0x6C, 0x00, 0x65, 0x00, 0x20, 0x00, 0x42, 0x00}));
  EXPECT_EQ(slice(bytes, 13 + 12, 88), units(0x20, 0x00, 44));
  EXPECT_EQ(slice(bytes, 13 + 100, 8), (Bytes{0xE8, 0x03, 0x00, 0x00, 0x00, 0x00, 0xC0, 0x3F}));
  EXPECT_EQ(slice(bytes, 13 + 260, 4), (Bytes{0x00, 0x00, 0xC0, 0xBF}));
  // Block 13 starts 12 blocks later: ColorRGB 13000.
  EXPECT_EQ(slice(bytes, 13 + 12 * 264 + 100, 4), (Bytes{0xC8, 0x32, 0x00, 0x00}));
}

// Without bounds on Tiles, the TSN is written and then the write fails.
TEST(KVTileSet, StreamOutWithoutTilesStopsAfterTheTsn) {
  auto set = filled_set();
  ByteArray bytes(0, 9);
  tTileSet unbounded;
  unbounded.TSN = u"AB";
  set->v1TileSet(unbounded);
  Long position = 2;
  EXPECT_FALSE(set->StreamOut(bytes, position));
  EXPECT_EQ(position, 8);
  EXPECT_EQ(bytes.ubound(), 8);
  EXPECT_EQ(slice(bytes, 2, 6), (Bytes{0x02, 0x00, 0x00, 0x00, 0x41, 0x42}));
}

TEST(KVTileSet, TilesKeepTheirSetAlive) {
  auto set = KVTileSet::create();
  std::weak_ptr<KVTileSet> watch = set;
  auto tile = set->Tiles(4);
  set.reset();
  ASSERT_FALSE(watch.expired());
  tile->ColorRGB(0x123456);
  EXPECT_EQ(watch.lock()->v1TileSet().Tiles(4).ColorRGB, 0x123456);
  tile.reset();
  EXPECT_TRUE(watch.expired());
}

TEST(KVTile, BandsOutsideOneToFortyAreSilent) {
  auto tile = KVTile::create();
  tile->TempCompWL(0, 5.0);
  tile->TempCompWL(41, 5.0);
  tile->TempCompWL(-1, 5.0);
  EXPECT_EQ(tile->TempCompWL(0), 0.0);
  EXPECT_EQ(tile->TempCompWL(41), 0.0);
  EXPECT_EQ(tile->v1Tile().TempComp, tSpectrum{});
}

}  // namespace
}  // namespace kvdata
