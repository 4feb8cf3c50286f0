#include "kvdata/foundation/records.hpp"

#include <gtest/gtest.h>

#include "support/error_number.hpp"

namespace kvdata {
namespace {

using testing::error_number;

TEST(Records, AssignmentCopiesTheRecordInAVariant) {
  tOVProfile profile;
  profile.ProfileData = tOVProfileDataV1{};
  tOVProfile profile_copy = profile;
  profile_copy.ProfileData.get<tOVProfileDataV1>().Dark(eSC::SCI).Data(1) = 2.0f;
  EXPECT_EQ(profile.ProfileData.get<tOVProfileDataV1>().Dark(eSC::SCI).Data(1), 0.0f);
  EXPECT_EQ(profile.ProfileData.type(), VarType::UserDefinedType);
}

TEST(Records, FreshRecordsAreEmptyAndFixedArraysKeepTheirIndexRanges) {
  tTileSet set;
  EXPECT_EQ(error_number([&] { (void)set.Tiles.ubound(); }), kSubscriptOutOfRange);
  tTestRun1 run;
  EXPECT_TRUE(run.ISN.empty());
  EXPECT_EQ(run.TestDate, Date{0.0});
  EXPECT_FALSE(run.IIA.Has2Measurement);
  EXPECT_EQ(run.IIA.Measurements(1).Tiles.rank(), 0);
  EXPECT_TRUE(tOVProfile{}.ProfileData.is_empty());

  tSpectrum spectrum;
  tSCPair pair;
  tDeltas deltas;
  EXPECT_EQ(error_number([&] { (void)spectrum.Data(0); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { (void)pair.Spectrum(2); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { (void)deltas.dE(2); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { (void)run.IIA.Measurements(0); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { (void)run.LightLevels.LightLevels(9); }), kSubscriptOutOfRange);
}

}  // namespace
}  // namespace kvdata
