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
