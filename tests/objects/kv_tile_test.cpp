#include "kvdata/objects/kv_tile.hpp"

#include <gtest/gtest.h>

#include "support/error_number.hpp"
#include "support/streams.hpp"

namespace kvdata {
namespace {

using testing::error_number;

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
