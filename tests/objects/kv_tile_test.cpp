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
