#include "kvdata/objects/kv_tile.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "support/error_number.hpp"
#include "support/streams.hpp"

namespace kvdata {
namespace {

using testing::Bytes;
using testing::cat;
using testing::error_number;
using testing::slice;
using testing::stream_of;
using testing::units;

TEST(KVTile, NewTileIsAllZeroAndStreamsAsZeroBlock) {
  auto tile = KVTile::create();
  EXPECT_EQ(tile->Order(), 0);
  EXPECT_EQ(tile->ColorName(), String(50, u'\0'));  // U+0000 units are not trimmed
  EXPECT_EQ(tile->ColorRGB(), 0);
  EXPECT_EQ(tile->StreamLen(), 264);
  EXPECT_EQ(tile->v1Tile(), (tTileDef{String(50, u'\0'), 0, {}}));

  ByteArray bytes;  // never given bounds: created from index 0
  ASSERT_TRUE(tile->StreamOut(bytes));
  EXPECT_EQ(bytes.lbound(), 0);
  EXPECT_EQ(bytes.ubound(), 264);
  EXPECT_EQ(slice(bytes, 0, 265), Bytes(265, 0));
}

TEST(KVTile, BlockLayoutWithPaddedNameColourAndFirstAndLastBand) {
  auto tile = KVTile::create();
  tile->ColorName(u"  Red");
  tile->ColorRGB(0x00112233);
  tile->TempCompWL(1, 1.0);
  tile->TempCompWL(40, -2.5);
  EXPECT_EQ(tile->ColorName(), u"Red");
  EXPECT_EQ(tile->TempCompWL(1), 1.0);
  EXPECT_EQ(tile->TempCompWL(40), -2.5);

  ByteArray bytes(0, 999);
  for (Long i = 0; i <= 999; ++i) bytes(i) = 0xAA;
  Long position = 10;
  ASSERT_TRUE(tile->StreamOut(bytes, position));
  EXPECT_EQ(position, 274);
  EXPECT_EQ(bytes.lbound(), 0);
  EXPECT_EQ(bytes.ubound(), 274);  // a longer array is shortened to the final Position
  EXPECT_EQ(slice(bytes, 0, 10), Bytes(10, 0xAA));

  const Bytes expected = cat({
      {0x20, 0x00, 0x20, 0x00, 0x52, 0x00, 0x65, 0x00, 0x64, 0x00},  // "  Red"
      units(0x20, 0x00, 45),                                         // blank padding
      {0x33, 0x22, 0x11, 0x00},                                      // ColorRGB
      {0x00, 0x00, 0x80, 0x3F},                                      // band 1 = 1.0
      Bytes(38 * 4, 0x00),                                           // bands 2 to 39
      {0x00, 0x00, 0x20, 0xC0},                                      // band 40 = -2.5
  });
  ASSERT_EQ(expected.size(), 264u);
  EXPECT_EQ(slice(bytes, 10, 264), expected);
  EXPECT_EQ(bytes(274), 0xAA);  // the element at the final Position keeps its byte
}

TEST(KVTile, LongNamesAreCutAtFiftyUnits) {
  auto tile = KVTile::create();
  String name;
  for (int i = 0; i < 60; ++i) name.push_back(static_cast<char16_t>(u'A' + i % 26));
  tile->ColorName(name);
  EXPECT_EQ(tile->ColorName(), name.substr(0, 50));

  ByteArray bytes;
  ASSERT_TRUE(tile->StreamOut(bytes));
  EXPECT_EQ(slice(bytes, 96, 6), (Bytes{0x57, 0x00, 0x58, 0x00, 0x00, 0x00}));  // "WX", RGB 0

  tTileDef def;
  def.Name = name;
  tile->v1Tile(def);
  EXPECT_EQ(tile->v1Tile().Name, name.substr(0, 50));
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

TEST(KVTile, BandValuesAreNarrowedToSingle) {
  auto tile = KVTile::create();
  tile->TempCompWL(2, 0.1);
  EXPECT_EQ(tile->TempCompWL(2), static_cast<Double>(0.1f));
  tile->TempCompWL(3, 1e300);
  EXPECT_EQ(tile->TempCompWL(3), std::numeric_limits<Double>::infinity());
  tile->TempCompWL(4, -1e300);
  EXPECT_EQ(tile->TempCompWL(4), -std::numeric_limits<Double>::infinity());
  // Just above the largest Single, but nearer to it than to infinity.
  tile->TempCompWL(5, 3.4028235e38 + 1e30);
  EXPECT_EQ(tile->TempCompWL(5), static_cast<Double>(std::numeric_limits<Single>::max()));
  tile->TempCompWL(6, std::numeric_limits<Double>::quiet_NaN());
  EXPECT_TRUE(std::isnan(tile->TempCompWL(6)));
}

TEST(KVTile, StreamInReadsTheBlockOrNothing) {
  const Bytes block = cat({
      {0x20, 0x00, 0x41, 0x00, 0x42, 0x00},  // " AB"
      units(0x20, 0x00, 47),
      {0xFF, 0xFF, 0xFF, 0xFF},  // ColorRGB -1
      {0x00, 0x00, 0x80, 0x3E},  // band 1 = 0.25
      Bytes(38 * 4, 0x00),
      {0x00, 0x00, 0xAF, 0x42},  // band 40 = 87.5
  });
  ASSERT_EQ(block.size(), 264u);

  auto tile = KVTile::create();
  tile->Order(7);
  ByteArray bytes = stream_of(cat({{0x99}, block}), 1);  // loaded from a file: index 1 first
  Long position = 2;
  ASSERT_TRUE(tile->StreamIn(bytes, position));
  EXPECT_EQ(position, 266);
  EXPECT_EQ(tile->ColorName(), u"AB");
  EXPECT_EQ(tile->ColorRGB(), -1);
  EXPECT_EQ(tile->TempCompWL(1), 0.25);
  EXPECT_EQ(tile->TempCompWL(40), 87.5);
  EXPECT_EQ(tile->Order(), 7);  // not carried by the stream

  // Short by one byte, only 100 bytes, Position past the end or before the start:
  // the tile keeps its contents and Position moves by the bytes that were there.
  const tTileDef before = tile->v1Tile();
  struct Case {
    Long lower;
    Long size;
    Long position;
    Long moved;
  };
  for (const Case c : {Case{0, 263, 0, 263}, Case{0, 150, 50, 100}, Case{0, 10, 11, 0},
                       Case{1, 300, 0, 0}, Case{0, 300, -5, 0}}) {
    ByteArray short_bytes = stream_of(Bytes(static_cast<std::size_t>(c.size), 0x41), c.lower);
    Long pos = c.position;
    EXPECT_FALSE(tile->StreamIn(short_bytes, pos)) << c.size << " at " << c.position;
    EXPECT_EQ(pos, c.position + c.moved);
    EXPECT_EQ(tile->v1Tile(), before);
  }
  ByteArray none;
  Long pos = 0;
  EXPECT_FALSE(tile->StreamIn(none, pos));
  EXPECT_EQ(pos, 0);
}

TEST(KVTile, ReadingPositionsThatWouldOverflowFail) {
  auto tile = KVTile::create();
  tile->ColorRGB(5);
  constexpr Long kMax = std::numeric_limits<Long>::max();

  // Reading from an array whose last index is the largest Long: the bytes are there,
  // but Position could not move past the last one, so none is taken.
  ByteArray top(kMax - 263, kMax);
  Long position = kMax - 263;
  EXPECT_FALSE(tile->StreamIn(top, position));
  EXPECT_EQ(position, kMax - 263);
  EXPECT_EQ(tile->ColorRGB(), 5);
}

TEST(KVTile, RoundTripKeepsTheReceiversOrder) {
  auto source = KVTile::create();
  source->ColorName(u"Cyan 2");
  source->ColorRGB(-123456);
  for (Integer band = 1; band <= 40; ++band) source->TempCompWL(band, band * 0.5);
  source->Order(3);

  ByteArray bytes;
  Long position = 0;
  ASSERT_TRUE(source->StreamOut(bytes, position));
  ASSERT_TRUE(source->StreamOut(bytes, position));  // a second tile after the first
  EXPECT_EQ(position, 528);
  EXPECT_EQ(bytes.ubound(), 528);

  auto target = KVTile::create();
  target->Order(9);
  Long read = 264;
  ASSERT_TRUE(target->StreamIn(bytes, read));
  EXPECT_EQ(read, 528);
  EXPECT_EQ(target->v1Tile(), source->v1Tile());
  EXPECT_EQ(target->Order(), 9);
}

}  // namespace
}  // namespace kvdata
