#include "kvdata/stats/kv_test_run_spread_test_data.hpp"

#include <gtest/gtest.h>

#include <bit>
#include <cstdint>
#include <fstream>
#include <initializer_list>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "kvdata/automation/create_object.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/objects/kv_tol_set.hpp"
#include "spread_samples.hpp"
#include "support/error_number.hpp"

namespace kvdata {
namespace {

using testing::error_number;

using Spread = KVTestRunSpreadTestData;
using Rows = std::vector<std::vector<Single>>;

template <class T = Single>
Variant sample(std::initializer_list<T> values, Long lower = 1) {
  Array<T> a(lower, lower + static_cast<Long>(values.size()) - 1);
  Long i = lower;
  for (T v : values) a(i++) = v;
  return a;
}

const Array<Single>& table(const Variant& v) {
  return v.get<Array<Single>>();
}

// A table as rows 1 (white) and 2 (blue) of points 1..n.
Rows rows(const Variant& v) {
  const Array<Single>& a = table(v);
  EXPECT_EQ(a.lbound(1), 1);
  EXPECT_EQ(a.lbound(2), 1);
  Rows r;
  for (Long t = 1; t <= a.ubound(1); ++t) {
    r.emplace_back();
    for (Long p = 1; p <= a.ubound(2); ++p) r.back().push_back(a(t, p));
  }
  return r;
}

TEST(KVTestRunSpreadTestData, StartsEmptyAndRefusesWorkUntilInitialisedAndSelected) {
  auto rr = query<Spread>(CreateObject(u"KVData.KVTestRunSpreadTestData"));
  ASSERT_NE(rr, nullptr);
  EXPECT_EQ(rr->KVRR_GetNumberOfSpectralDataPoints(), 0);
  EXPECT_EQ(rr->KVRR_GetCurrentTestIndex(), 0);
  EXPECT_EQ(rr->KVRR_GetWhiteRepeatibilitySpectralData(), nullptr);
  EXPECT_EQ(rr->KVRR_GetBlueRepeatibilitySpectralData(), nullptr);
  EXPECT_EQ(table(rr->KVRR_GetAverageWL()).rank(), 0);
  EXPECT_EQ(table(rr->KVRR_GetStdDev()).rank(), 0);

  // A tile selected but not initialised.
  EXPECT_TRUE(rr->KVRR_SetCurrentTestToWhiteTile().is_empty());
  EXPECT_EQ(rr->KVRR_GetCurrentTestIndex(), 1);
  EXPECT_EQ(rr->KVRR_AddSpectralData(sample({1.0f})), Spread::kNotReady);
  EXPECT_EQ(rr->KVRR_SetStdDev(sample({1.0f})), Spread::kNotReady);

  // Initialised but no tile current: nothing stored; calculating still
  // leaves the blue tile current.
  ASSERT_EQ(rr->KVRR_Initialize(3), Spread::kSuccess);
  EXPECT_EQ(rr->KVRR_GetCurrentTestIndex(), 0);
  EXPECT_EQ(rr->KVRR_AddSpectralData(sample({1.0f, 2.0f, 3.0f})), Spread::kNotReady);
  EXPECT_EQ(rr->KVRR_GetWhiteRepeatibilitySpectralData()->Count(), 0);
  EXPECT_EQ(rr->KVRR_SetStdDev(sample({1.0f, 2.0f, 3.0f})), Spread::kNotReady);
  EXPECT_EQ(rr->KVRR_CalculateSpreadTestData(), Spread::kNotReady);
  EXPECT_EQ(rr->KVRR_GetCurrentTestIndex(), 2);
  EXPECT_EQ(rows(rr->KVRR_GetAverageWL()), Rows(2, std::vector<Single>(3, 0.0f)));
}

TEST(KVTestRunSpreadTestData, ComputesMeanLowestHighestAndSpreadPerTileAndPoint) {
  auto rr = Spread::create();
  ASSERT_EQ(rr->KVRR_Initialize(3), 0);
  rr->KVRR_SetCurrentTestToWhiteTile();
  EXPECT_EQ(rr->KVRR_AddSpectralData(sample({1.0f, 10.0f, 9999.5f})), 0);
  // Samples of other element types are read as numbers.
  EXPECT_EQ(rr->KVRR_AddSpectralData(sample<Double>({1.0, 20.0, 10000.0})), 0);
  EXPECT_EQ(rr->KVRR_AddSpectralData(sample<Long>({1, 30, 12000})), 0);
  rr->KVRR_SetCurrentTestToBlueTile();
  EXPECT_EQ(rr->KVRR_AddSpectralData(sample({-10000.0f, 5.5f, -2.0f})), 0);

  auto whites = rr->KVRR_GetWhiteRepeatibilitySpectralData();
  ASSERT_EQ(whites->Count(), 3);
  EXPECT_TRUE(whites->Contains(u"1") && whites->Contains(u"2") && whites->Contains(u"3"));
  EXPECT_EQ(whites->Item(String(u"2")).get<Array<Double>>()(2), 20.0);
  EXPECT_EQ(rr->KVRR_GetBlueRepeatibilitySpectralData()->Count(), 1);

  EXPECT_EQ(rr->KVRR_CalculateSpreadTestData(), 0);
  EXPECT_EQ(rr->KVRR_GetCurrentTestIndex(), 2);
  // White point 3 has every sample at 9999 or more: the lowest stays at its
  // start of 9999. Blue has one sample, so it is the mean, the lowest and
  // the highest, except at -10000, where the highest stays at its start of -9999.
  EXPECT_EQ(rows(rr->KVRR_GetAverageWL()), (Rows{{1, 20, 10666.5f}, {-10000, 5.5f, -2}}));
  EXPECT_EQ(rows(rr->KVRR_GetLowestWL()), (Rows{{1, 10, 9999}, {-10000, 5.5f, -2}}));
  EXPECT_EQ(rows(rr->KVRR_GetHighestWL()), (Rows{{1, 30, 12000}, {-9999, 5.5f, -2}}));
  EXPECT_EQ(rows(rr->KVRR_GetSpreadOfEachWL()), (Rows{{0, 20, 2001}, {1, 0, 0}}));
}

TEST(KVTestRunSpreadTestData, MeanRoundsTheSumToSingleAfterEverySample) {
  auto rr = Spread::create();
  ASSERT_EQ(rr->KVRR_Initialize(1), 0);
  rr->KVRR_SetCurrentTestToBlueTile();
  // 1 + 4e-8 is 1 as a Single, so the sum stays 1 and the mean is the
  // Single nearest 1/3; a sum kept in double would give the next Single up.
  for (Double v : {1.0, 4e-8, 4e-8}) ASSERT_EQ(rr->KVRR_AddSpectralData(sample<Double>({v})), 0);
  rr->KVRR_SetCurrentTestToWhiteTile();
  ASSERT_EQ(rr->KVRR_AddSpectralData(sample({0.0f})), 0);
  ASSERT_EQ(rr->KVRR_CalculateSpreadTestData(), 0);
  EXPECT_EQ(std::bit_cast<std::uint32_t>(table(rr->KVRR_GetAverageWL())(2, 1)), 0x3EAAAAABu);
}

TEST(KVTestRunSpreadTestData, ATileWithoutSamplesStopsTheCalculation) {
  auto rr = Spread::create();
  ASSERT_EQ(rr->KVRR_Initialize(2), 0);
  rr->KVRR_SetCurrentTestToWhiteTile();
  rr->KVRR_AddSpectralData(sample({4.0f, 6.0f}));
  rr->KVRR_AddSpectralData(sample({2.0f, 8.0f}));
  EXPECT_EQ(rr->KVRR_CalculateSpreadTestData(), Spread::kNoSamples);
  EXPECT_EQ(rr->KVRR_GetCurrentTestIndex(), 2);
  EXPECT_EQ(rows(rr->KVRR_GetAverageWL()), (Rows{{3, 7}, {0, 0}}));
  EXPECT_EQ(rows(rr->KVRR_GetLowestWL()), (Rows{{2, 6}, {0, 0}}));  // blue untouched, not 9999

  // Blue rows computed once keep their values when the blue samples are gone.
  rr->KVRR_SetCurrentTestToBlueTile();
  rr->KVRR_AddSpectralData(sample({1.0f, 3.0f}));
  ASSERT_EQ(rr->KVRR_CalculateSpreadTestData(), 0);
  rr->KVRR_GetBlueRepeatibilitySpectralData()->Remove(Long{1});
  rr->KVRR_SetCurrentTestToWhiteTile();
  rr->KVRR_AddSpectralData(sample({10.0f, 10.0f}));
  EXPECT_EQ(rr->KVRR_CalculateSpreadTestData(), Spread::kNoSamples);
  const Array<Single> avg = table(rr->KVRR_GetAverageWL());
  EXPECT_FLOAT_EQ(avg(1, 1), 16.0f / 3.0f);
  EXPECT_EQ(avg(2, 2), 3.0f);
  EXPECT_EQ(table(rr->KVRR_GetHighestWL())(2, 1), 1.0f);
}

TEST(KVTestRunSpreadTestData, OnlySamplesOfExactlyOneToNAreStored) {
  auto rr = Spread::create();
  ASSERT_EQ(rr->KVRR_Initialize(3), 0);
  rr->KVRR_SetCurrentTestToWhiteTile();
  auto whites = rr->KVRR_GetWhiteRepeatibilitySpectralData();
  EXPECT_EQ(rr->KVRR_AddSpectralData(sample({1.0f, 2.0f, 3.0f}, 0)), 0);     // 0 To 2
  EXPECT_EQ(rr->KVRR_AddSpectralData(sample({1.0f, 2.0f, 3.0f, 4.0f})), 0);  // 1 To 4
  EXPECT_EQ(rr->KVRR_AddSpectralData(sample({1.0f, 2.0f})), 0);              // 1 To 2
  EXPECT_EQ(whites->Count(), 0);
  EXPECT_EQ(error_number([&] { rr->KVRR_AddSpectralData(Variant(Single{1.0f})); }), kTypeMismatch);
  EXPECT_EQ(error_number([&] { rr->KVRR_AddSpectralData(Variant(Array<Single>())); }),
            kSubscriptOutOfRange);
  EXPECT_EQ(whites->Count(), 0);

  // A stored sample is the caller's array copied, not shared.
  Array<Single> mine(1, 3);
  mine(1) = 5.0f;
  Variant held = mine;
  ASSERT_EQ(rr->KVRR_AddSpectralData(held), 0);
  held.get<Array<Single>>()(1) = 99.0f;
  EXPECT_EQ(table(whites->Item(String(u"1")))(1), 5.0f);

  // A sample that cannot be read as numbers fails the calculation.
  Array<String> text(1, 3);
  text(1) = u"2.5";
  text(2) = u"x";
  rr->KVRR_SetCurrentTestToBlueTile();
  ASSERT_EQ(rr->KVRR_AddSpectralData(Variant(text)), 0);
  EXPECT_EQ(error_number([&] { rr->KVRR_CalculateSpreadTestData(); }), kTypeMismatch);
}

TEST(KVTestRunSpreadTestData, NewSamplesFollowTheTileFlagNotTheCurrentIndex) {
  auto rr = Spread::create();
  ASSERT_EQ(rr->KVRR_Initialize(2), 0);
  rr->KVRR_SetCurrentTestToBlueTile();
  rr->KVRR_AddSpectralData(sample({1.0f, 1.0f}));
  rr->KVRR_SetCurrentTestToWhiteTile();
  rr->KVRR_AddSpectralData(sample({2.0f, 2.0f}));
  ASSERT_EQ(rr->KVRR_CalculateSpreadTestData(), 0);
  EXPECT_EQ(rr->KVRR_GetCurrentTestIndex(), 2);
  // Index 2, but the white tile is still the one selected for samples.
  rr->KVRR_AddSpectralData(sample({3.0f, 3.0f}));
  EXPECT_EQ(rr->KVRR_GetWhiteRepeatibilitySpectralData()->Count(), 2);
  EXPECT_EQ(rr->KVRR_GetBlueRepeatibilitySpectralData()->Count(), 1);
  // ... while the standard deviations go to the blue row until a tile is selected.
  ASSERT_EQ(rr->KVRR_SetStdDev(sample({0.25f, 0.5f})), 0);
  EXPECT_EQ(rows(rr->KVRR_GetStdDev()), (Rows{{0, 0}, {0.25f, 0.5f}}));
  rr->KVRR_SetCurrentTestToWhiteTile();
  // Any bounds that accept 1..n will do; one that stops short fails after
  // writing what it could.
  ASSERT_EQ(rr->KVRR_SetStdDev(sample<Double>({9.0, 0.125, 0.75, 9.0}, 0)), 0);
  EXPECT_EQ(error_number([&] { rr->KVRR_SetStdDev(sample({7.0f})); }), kSubscriptOutOfRange);
  EXPECT_EQ(rows(rr->KVRR_GetStdDev()), (Rows{{7, 0.75f}, {0.25f, 0.5f}}));
}

TEST(KVTestRunSpreadTestData, ReinitialisingDropsSamplesAndZeroesTables) {
  auto rr = Spread::create();
  ASSERT_EQ(rr->KVRR_Initialize(2), 0);
  rr->KVRR_SetCurrentTestToWhiteTile();
  rr->KVRR_AddSpectralData(sample({1.0f, 2.0f}));
  rr->KVRR_SetCurrentTestToBlueTile();
  rr->KVRR_AddSpectralData(sample({3.0f, 4.0f}));
  ASSERT_EQ(rr->KVRR_CalculateSpreadTestData(), 0);
  auto old_whites = rr->KVRR_GetWhiteRepeatibilitySpectralData();

  ASSERT_EQ(rr->KVRR_Initialize(4), 0);
  EXPECT_EQ(rr->KVRR_GetNumberOfSpectralDataPoints(), 4);
  EXPECT_EQ(rr->KVRR_GetCurrentTestIndex(), 0);
  EXPECT_EQ(rr->KVRR_GetWhiteRepeatibilitySpectralData()->Count(), 0);
  EXPECT_NE(rr->KVRR_GetWhiteRepeatibilitySpectralData(), old_whites);
  EXPECT_EQ(old_whites->Count(), 1);  // the caller's reference keeps its samples
  for (const Variant& t : {rr->KVRR_GetAverageWL(), rr->KVRR_GetLowestWL(), rr->KVRR_GetHighestWL(),
                           rr->KVRR_GetSpreadOfEachWL(), rr->KVRR_GetStdDev()})
    EXPECT_EQ(rows(t), Rows(2, std::vector<Single>(4, 0.0f)));
  // The blue flag is still set, but a tile must be selected again.
  EXPECT_EQ(rr->KVRR_AddSpectralData(sample({1.0f, 1.0f, 1.0f, 1.0f})), Spread::kNotReady);

  // A point count below 1: -2, n taken, everything else as it was.
  rr->KVRR_SetCurrentTestToBlueTile();
  rr->KVRR_AddSpectralData(sample({1.0f, 1.0f, 1.0f, 1.0f}));
  EXPECT_EQ(rr->KVRR_Initialize(0), Spread::kNotReady);
  EXPECT_EQ(rr->KVRR_GetNumberOfSpectralDataPoints(), 0);
  EXPECT_EQ(rr->KVRR_GetCurrentTestIndex(), 0);
  EXPECT_EQ(rr->KVRR_GetBlueRepeatibilitySpectralData()->Count(), 1);
  EXPECT_EQ(table(rr->KVRR_GetAverageWL()).ubound(2), 4);
  EXPECT_EQ(rr->KVRR_Initialize(-3), Spread::kNotReady);
}

TEST(KVTestRunSpreadTestData, CopiesShareSamplesButReleaseOnlyItsOwnReferences) {
  auto a = Spread::create();
  ASSERT_EQ(a->KVRR_Initialize(2), 0);
  a->KVRR_SetCurrentTestToWhiteTile();
  a->KVRR_AddSpectralData(sample({1.0f, 2.0f}));
  a->KVRR_SetCurrentTestToBlueTile();
  a->KVRR_AddSpectralData(sample({5.0f, 6.0f}));
  ASSERT_EQ(a->KVRR_CalculateSpreadTestData(), 0);
  a->KVRR_SetCurrentTestToWhiteTile();

  auto b = Spread::create();
  ASSERT_EQ(b->KVRR_Copy(a), 0);
  EXPECT_EQ(b->KVRR_GetNumberOfSpectralDataPoints(), 2);
  EXPECT_EQ(b->KVRR_GetCurrentTestIndex(), 1);
  EXPECT_EQ(table(b->KVRR_GetAverageWL()), table(a->KVRR_GetAverageWL()));
  EXPECT_EQ(b->KVRR_GetWhiteRepeatibilitySpectralData(),
            a->KVRR_GetWhiteRepeatibilitySpectralData());

  // The tile flags are not copied: b has none set, so its samples go nowhere
  // until it selects a tile.
  EXPECT_EQ(b->KVRR_AddSpectralData(sample({3.0f, 4.0f})), 0);
  EXPECT_EQ(a->KVRR_GetWhiteRepeatibilitySpectralData()->Count(), 1);
  b->KVRR_SetCurrentTestToWhiteTile();
  b->KVRR_AddSpectralData(sample({3.0f, 4.0f}));
  a->KVRR_AddSpectralData(sample({5.0f, 6.0f}));
  EXPECT_EQ(a->KVRR_GetWhiteRepeatibilitySpectralData()->Count(), 3);
  EXPECT_EQ(b->KVRR_GetWhiteRepeatibilitySpectralData()->Count(), 3);
  EXPECT_TRUE(b->KVRR_GetWhiteRepeatibilitySpectralData()->Contains(u"3"));

  // Tables are copies: recalculating through b leaves a's tables alone.
  ASSERT_EQ(b->KVRR_CalculateSpreadTestData(), 0);
  EXPECT_EQ(table(b->KVRR_GetAverageWL())(1, 1), 3.0f);
  EXPECT_EQ(table(a->KVRR_GetAverageWL())(1, 1), 1.0f);

  // Releasing the copy, or destroying it, leaves a's samples in place.
  EXPECT_EQ(b->KVRR_ReleaseSpreadTestData(), 0);
  EXPECT_EQ(b->KVRR_GetWhiteRepeatibilitySpectralData(), nullptr);
  EXPECT_EQ(b->KVRR_GetBlueRepeatibilitySpectralData(), nullptr);
  EXPECT_EQ(table(b->KVRR_GetAverageWL()).rank(), 0);
  EXPECT_EQ(b->KVRR_GetNumberOfSpectralDataPoints(), 0);
  EXPECT_EQ(b->KVRR_AddSpectralData(sample({3.0f, 4.0f})), Spread::kNotReady);
  EXPECT_EQ(a->KVRR_GetWhiteRepeatibilitySpectralData()->Count(), 3);
  EXPECT_EQ(a->KVRR_GetBlueRepeatibilitySpectralData()->Count(), 1);
  auto c = Spread::create();
  ASSERT_EQ(c->KVRR_Copy(a), 0);
  c.reset();
  EXPECT_EQ(a->KVRR_GetWhiteRepeatibilitySpectralData()->Count(), 3);
  // And the other way round: releasing the source leaves the copy's samples.
  ASSERT_EQ(b->KVRR_Copy(a), 0);
  a->KVRR_ReleaseSpreadTestData();
  EXPECT_EQ(b->KVRR_GetWhiteRepeatibilitySpectralData()->Count(), 3);
  ASSERT_EQ(b->KVRR_CalculateSpreadTestData(), 0);

  // A copy of nothing fails and changes nothing.
  EXPECT_EQ(b->KVRR_Copy(nullptr), Spread::kCaughtError);
  EXPECT_EQ(b->KVRR_GetNumberOfSpectralDataPoints(), 2);
  EXPECT_EQ(b->KVRR_GetCurrentTestIndex(), 2);
}

TEST(KVTestRunSpreadTestData, KeysStayUniqueWhenACallerRemovesSamples) {
  auto rr = Spread::create();
  ASSERT_EQ(rr->KVRR_Initialize(1), 0);
  rr->KVRR_SetCurrentTestToWhiteTile();
  for (Single v : {1.0f, 2.0f, 3.0f}) rr->KVRR_AddSpectralData(sample({v}));
  auto whites = rr->KVRR_GetWhiteRepeatibilitySpectralData();
  whites->Remove(String(u"1"));  // keys "2" and "3" remain; count + 1 is taken
  ASSERT_EQ(rr->KVRR_AddSpectralData(sample({4.0f})), 0);
  EXPECT_EQ(whites->Count(), 3);
  EXPECT_EQ(table(whites->Item(String(u"4")))(1), 4.0f);
}

TEST(KVTestRunSpreadTestData, KeepsTheCallersToleranceSetUntilReleased) {
  auto rr = Spread::create();
  std::shared_ptr<IKVTolSet> set = KVTolSet::create();
  EXPECT_EQ(rr->KVRR_SetTolerance(set), 0);
  EXPECT_EQ(set.use_count(), 2);  // shared, not copied
  EXPECT_EQ(error_number([&] { rr->KVRR_SetTolerance(nullptr); }), kObjectNotSet);
  EXPECT_EQ(set.use_count(), 2);
  // Initialising and copying do not touch it; release drops it.
  ASSERT_EQ(rr->KVRR_Initialize(1), 0);
  auto other = Spread::create();
  ASSERT_EQ(other->KVRR_Copy(rr), 0);
  EXPECT_EQ(set.use_count(), 2);
  rr->KVRR_ReleaseSpreadTestData();
  EXPECT_EQ(set.use_count(), 1);
}

// Pseudo-random tests of every sample type, one stopped part way, give the
// tables bit for bit as recorded when each value went through its Variant.
TEST(KVTestRunSpreadTestData, RandomTestsGiveTheRecordedTablesToTheBit) {
  std::ifstream in(std::string(KVDATA_SOURCE_DIR) + "/tests/data/spread-results.txt");
  int t = 0;
  for (std::string line; std::getline(in, line);) {
    if (line.starts_with('#')) continue;
    std::vector<std::uint32_t> recorded;
    std::istringstream words(line);
    for (std::string word; words >> word;)
      recorded.push_back(static_cast<std::uint32_t>(std::stoul(word, nullptr, 16)));
    EXPECT_EQ(testing::spread_results(t), recorded) << "test " << t;
    ++t;
  }
  EXPECT_EQ(t, 9);
}

}  // namespace
}  // namespace kvdata
