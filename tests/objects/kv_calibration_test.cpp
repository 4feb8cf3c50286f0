#include "kvdata/objects/kv_calibration.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "kvdata/objects/kv_cal_tile.hpp"
#include "support/error_number.hpp"
#include "support/streams.hpp"

namespace kvdata {
namespace {

using testing::error_number;

// An IKVCalTile that is not a KVCalTile.
class ForeignCalTile : public IKVCalTile {
 protected:
  Integer IKVCalTile_Order() const override { return 1; }
  void IKVCalTile_Order(Integer) override {}
  Double IKVCalTile_SCWL(const eSC&, const Integer&) const override { return 1.0; }
  void IKVCalTile_SCWL(const eSC&, const Integer&, const Double&) override {}
};

tSCPair pair_with(Single sce_first, Single sci_last) {
  tSCPair pair;
  pair.Spectrum(eSC::SCE).Data(1) = sce_first;
  pair.Spectrum(eSC::SCI).Data(40) = sci_last;
  return pair;
}

tTileSetCalibration filled_record() {
  tTileSetCalibration record;
  record.TSN = u"TS-042";
  record.Certified = Date{45000.5};
  record.TempCalibrated = 23.5f;
  record.Tiles.redim(1, 13);
  for (Long i = 1; i <= 13; ++i) {
    record.Tiles(i) = pair_with(static_cast<Single>(i), static_cast<Single>(-i));
  }
  return record;
}

// The calibration's whole block, streamed out at Position 0.
ByteArray block_of(KVCalibration& cal) {
  ByteArray bytes;
  EXPECT_TRUE(cal.StreamOut(bytes));
  return bytes;
}

TEST(KVCalibration, TsnIsEightUnitsCutOrPadded) {
  auto cal = KVCalibration::create();
  cal->TSN(u"1234567890");
  EXPECT_EQ(cal->TSN(), u"12345678");
  cal->TSN(u"AB");
  EXPECT_EQ(cal->TSN(), u"AB      ");
  EXPECT_EQ(cal->ID().get<String>(), u"AB      ");
  EXPECT_EQ(cal->v1Calibration().TSN, u"AB");
  EXPECT_EQ(cal->TSN(), u"AB      ");  // the get above trims a copy only
}

TEST(KVCalibration, TilesAreWrittenBackAtTheirOrder) {
  auto cal = KVCalibration::create();
  cal->v1Calibration(filled_record());
  const tTileSetCalibration before = cal->v1Calibration();
  EXPECT_EQ(before, filled_record());

  auto third = cal->Tiles(3);
  EXPECT_EQ(third->Order(), 3);
  EXPECT_EQ(third->SCWL(eSC::SCE, 1), 3.0);
  EXPECT_EQ(third->SCWL(eSC::SCI, 40), -3.0);
  third->SCWL(eSC::SCE, 2, 0.5);
  tTileSetCalibration expected = before;
  expected.Tiles(3).Spectrum(eSC::SCE).Data(2) = 0.5f;
  EXPECT_EQ(cal->v1Calibration(), expected);

  // Changing Order copies the tile to the new slot; the old slot keeps its data.
  third->Order(5);
  expected.Tiles(5) = expected.Tiles(3);
  EXPECT_EQ(cal->v1Calibration(), expected);
  query<KVCalTile>(third)->v1Tile(tSCPair{});
  expected.Tiles(5) = tSCPair{};
  EXPECT_EQ(cal->v1Calibration(), expected);
}

TEST(KVCalibration, OutOfRangeTilesAndBandsChangeNothing) {
  auto cal = KVCalibration::create();
  cal->v1Calibration(filled_record());
  const ByteArray before = block_of(*cal);

  for (const Integer idx : {Integer{0}, Integer{14}, Integer{-1}}) {
    auto tile = cal->Tiles(idx);
    EXPECT_EQ(tile->Order(), idx);
    EXPECT_EQ(query<KVCalTile>(tile)->v1Tile(), tSCPair{});
    tile->SCWL(eSC::SCI, 40, 99.0);
    cal->Tiles(idx, KVCalTile::create());
  }
  auto tile = cal->Tiles(4);
  tile->SCWL(eSC::SCE, 0, 5.0);
  tile->SCWL(eSC::SCE, 41, 5.0);
  EXPECT_EQ(tile->SCWL(eSC::SCE, 0), 0.0);
  EXPECT_EQ(tile->SCWL(static_cast<eSC>(2), 41), 0.0);  // band out of range: no error
  EXPECT_EQ(block_of(*cal), before);

  // A band in range with a spectrum index other than SCE or SCI: error 9, nothing stored.
  EXPECT_EQ(error_number([&] { (void)tile->SCWL(static_cast<eSC>(2), 1); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { tile->SCWL(static_cast<eSC>(-1), 1, 5.0); }), kSubscriptOutOfRange);
  EXPECT_EQ(query<KVCalTile>(tile)->v1Tile(), filled_record().Tiles(4));
  EXPECT_EQ(block_of(*cal), before);
}

TEST(KVCalibration, CalibrationErrors) {
  auto cal = KVCalibration::create();
  cal->v1Calibration(filled_record());
  const ByteArray before = block_of(*cal);

  auto foreign = std::make_shared<ForeignCalTile>();
  EXPECT_EQ(error_number([&] { cal->Tiles(3, foreign); }), kTypeMismatch);
  EXPECT_EQ(error_number([&] { cal->Tiles(20, foreign); }), kTypeMismatch);
  EXPECT_EQ(error_number([&] { cal->Tiles(3, nullptr); }), kObjectNotSet);
  EXPECT_EQ(block_of(*cal), before);

  // Tiles bounds 0 to 12: TSN, date, temperature and slots 1 to 12 are copied, then error 9.
  tTileSetCalibration shifted;
  shifted.TSN = u"NEW";
  shifted.Certified = Date{1.25};
  shifted.TempCalibrated = -4.0f;
  shifted.Tiles.redim(0, 12);
  for (Long i = 0; i <= 12; ++i) shifted.Tiles(i) = pair_with(100.0f + static_cast<Single>(i), 0);
  EXPECT_EQ(error_number([&] { cal->v1Calibration(shifted); }), kSubscriptOutOfRange);
  const tTileSetCalibration after = cal->v1Calibration();
  EXPECT_EQ(after.TSN, u"NEW");
  EXPECT_EQ(after.Certified, Date{1.25});
  EXPECT_EQ(after.TempCalibrated, -4.0f);
  EXPECT_EQ(after.Tiles(12), shifted.Tiles(12));
  EXPECT_EQ(after.Tiles(13), filled_record().Tiles(13));
}

TEST(KVCalibration, TilesKeepTheirCalibrationAlive) {
  auto cal = KVCalibration::create();
  std::weak_ptr<KVCalibration> watch = cal;
  auto tile = cal->Tiles(7);
  cal.reset();
  ASSERT_FALSE(watch.expired());
  tile->SCWL(eSC::SCI, 10, 12.5);
  EXPECT_EQ(watch.lock()->v1Calibration().Tiles(7).Spectrum(eSC::SCI).Data(10), 12.5f);
  tile.reset();
  EXPECT_TRUE(watch.expired());
}

}  // namespace
}  // namespace kvdata
