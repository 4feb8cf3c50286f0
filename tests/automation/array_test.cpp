#include "kvdata/automation/array.hpp"

#include <gtest/gtest.h>

#include <iterator>
#include <limits>
#include <utility>

#include "support/error_number.hpp"

#include "kvdata/foundation/enums.hpp"

namespace kvdata {
namespace {

using testing::error_number;

TEST(Array, WithoutBoundsEveryQueryRaisesNine) {
  Array<Long> a;
  EXPECT_EQ(a.rank(), 0);
  EXPECT_EQ(error_number([&] { (void)a.lbound(); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { (void)a.ubound(); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { (void)a(0); }), kSubscriptOutOfRange);

  // Dimensioned with no elements is not the same as never dimensioned.
  Array<Long> empty(0, -1);
  EXPECT_EQ(empty.rank(), 1);
  EXPECT_EQ(empty.ubound(), -1);
  EXPECT_EQ(empty.size(), 0u);
  EXPECT_FALSE(empty == a);
}

TEST(Array, OwnIndexRangesAreCheckedOnBothSides) {
  Array<Single> a(1, 40);
  EXPECT_EQ(a.lbound(), 1);
  EXPECT_EQ(a.ubound(), 40);
  EXPECT_EQ(a(1), 0.0f);
  a(40) = 2.5f;
  EXPECT_EQ(a.data()[39], 2.5f);
  EXPECT_EQ(error_number([&] { (void)a(0); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { (void)a(41); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { (void)a(1, 1); }), kSubscriptOutOfRange);  // wrong rank
  EXPECT_EQ(error_number([&] { (void)a.lbound(2); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([] { Array<Byte> bad(5, 3); }), kSubscriptOutOfRange);

  Array<Long> negative(-3, -1);
  negative(-3) = 7;
  EXPECT_EQ(negative.data()[0], 7);
}

TEST(Array, TwoDimensionsKeepTheFirstIndexFastest) {
  Array<Single> t({{1, 2}, {1, 3}});
  EXPECT_EQ(t.rank(), 2);
  EXPECT_EQ(t.lbound(2), 1);
  EXPECT_EQ(t.ubound(2), 3);
  t(2, 1) = 5.0f;
  t(1, 3) = 6.0f;
  EXPECT_EQ(t.data()[1], 5.0f);
  EXPECT_EQ(t.data()[4], 6.0f);
  EXPECT_EQ(error_number([&] { (void)t(3, 1); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { (void)t(1, 4); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { (void)t(1); }), kSubscriptOutOfRange);
}

TEST(Array, RedimDiscardsAndRedimPreserveKeepsWhatStaysInside) {
  ByteArray a(1, 4);
  for (Long i = 1; i <= 4; ++i) a(i) = static_cast<Byte>(i);

  a.redim_preserve(1, 6);  // lower bound kept, new elements zero
  EXPECT_EQ(a.lbound(), 1);
  EXPECT_EQ(a.ubound(), 6);
  EXPECT_EQ(a(4), 4);
  EXPECT_EQ(a(6), 0);

  a.redim_preserve(1, 2);  // cut
  EXPECT_EQ(a.ubound(), 2);
  EXPECT_EQ(a(2), 2);
  a.redim_preserve(1, 3);  // regrown element comes back zero, not the old 3
  EXPECT_EQ(a(3), 0);

  a.redim_preserve(0, 3);  // lower bound moved: elements keep their indices
  EXPECT_EQ(a(0), 0);
  EXPECT_EQ(a(1), 1);
  EXPECT_EQ(a(2), 2);

  a.redim(0, 1);
  EXPECT_EQ(a(1), 0);

  ByteArray fresh;  // an array without bounds gets them
  fresh.redim_preserve(0, 0);
  EXPECT_EQ(fresh.ubound(), 0);

  a.erase();
  EXPECT_EQ(a.rank(), 0);
}

TEST(Array, GrowingOneElementAtATimeReallocatesOnlyLogarithmicallyOften) {
  ByteArray a(0, -1);
  int moves = 0;
  const Byte* last = nullptr;
  for (Long i = 0; i < 1'000'000; ++i) {
    a.redim_preserve(0, i);
    a(i) = static_cast<Byte>(i);
    if (a.data() != last) {
      ++moves;
      last = a.data();
    }
  }
  EXPECT_EQ(a.ubound(), 999'999);  // the bound stays exact
  EXPECT_LT(moves, 64);
  EXPECT_EQ(a(999'999), static_cast<Byte>(999'999));
}

TEST(Array, SpareElementsStayOutsideTheBoundsAndComeBackZero) {
  ByteArray grown(0, -1);
  for (Long i = 0; i <= 4; ++i) {
    grown.redim_preserve(0, i);
    grown(i) = static_cast<Byte>(10 + i);
  }
  // Iteration, size and comparison see the bounds only, never the spare room.
  EXPECT_EQ(grown.size(), 5u);
  EXPECT_EQ(std::distance(grown.begin(), grown.end()), 5);
  ByteArray exact(0, 4);
  for (Long i = 0; i <= 4; ++i) exact(i) = static_cast<Byte>(10 + i);
  EXPECT_TRUE(grown == exact);
  EXPECT_EQ(error_number([&] { (void)grown(5); }), kSubscriptOutOfRange);

  // A cut followed by growth into the room it left finds zeros, whether the
  // growth goes through redim_preserve or try_extend.
  grown.redim_preserve(0, 1);
  EXPECT_TRUE(grown.try_extend(3));
  EXPECT_EQ(grown.ubound(), 3);
  EXPECT_EQ(grown(1), 11);
  EXPECT_EQ(grown(2), 0);
  EXPECT_EQ(grown(3), 0);
  grown.redim_preserve(0, 4);
  EXPECT_EQ(grown(4), 0);

  // try_extend never shrinks, never changes another rank and never gives
  // bounds to an array without them.
  EXPECT_FALSE(grown.try_extend(2));
  EXPECT_EQ(grown.ubound(), 4);
  Array<Single> table({{1, 2}, {1, 3}});
  EXPECT_FALSE(table.try_extend(5));
  EXPECT_EQ(table.rank(), 2);
  ByteArray none;
  EXPECT_FALSE(none.try_extend(0));
  EXPECT_EQ(none.rank(), 0);

  Array<String> texts(1, 3);
  texts(3) = u"gone";
  texts.redim_preserve(1, 2);
  EXPECT_TRUE(texts.try_extend(3));
  EXPECT_EQ(texts(3), u"");
}

// Bounds anywhere in the Long range: every element that both bounds hold
// keeps its value (index i holds the low byte of i), every new one is zero,
// and a refused request leaves the array as it was.
TEST(Array, RedimPreserveIsExactAtTheEdgesOfLong) {
  constexpr Long kMax = std::numeric_limits<Long>::max();
  constexpr Long kMin = std::numeric_limits<Long>::min();
  struct Case {
    Bounds from;
    Bounds to;
    Long error;
  };
  const Case cases[] = {
      {{kMax - 5, kMax}, {kMax - 1, kMax}, 0},  // a new lower bound, ending at the top
      {{kMax - 1, kMax - 1}, {kMax - 1, kMax}, 0},
      {{kMax - 2, kMax}, {kMax - 3, kMax}, 0},
      {{kMax - 2, kMax}, {kMax, kMax - 1}, 0},  // dimensioned, no elements
      {{kMin, kMin + 5}, {kMin, kMin + 1}, 0},
      {{kMin, kMin + 5}, {kMin + 3, kMin + 8}, 0},
      {{kMin, kMin + 2}, {kMax - 2, kMax}, 0},  // no index in common
      {{kMax - 2, kMax}, {kMax, kMax - 2}, kSubscriptOutOfRange},
      {{0, 3}, {kMin, kMax}, kOutOfMemory},  // 2^32 elements
      {{0, 3}, {-1, kMax}, kOutOfMemory},    // 2^31 + 1
  };
  for (const Case& c : cases) {
    ByteArray a(c.from.lower, c.from.upper);
    for (Byte& b : a) b = static_cast<Byte>(c.from.lower + (&b - a.data()));
    const ByteArray before = a;
    EXPECT_EQ(error_number([&] { a.redim_preserve(c.to.lower, c.to.upper); }), c.error)
        << c.to.lower << ".." << c.to.upper;
    if (c.error != 0) {
      EXPECT_TRUE(a == before);
      continue;
    }
    ASSERT_EQ(a.lbound(), c.to.lower);
    ASSERT_EQ(a.ubound(), c.to.upper);
    for (long long i = c.to.lower; i <= c.to.upper; ++i) {
      const bool kept = i >= c.from.lower && i <= c.from.upper;
      EXPECT_EQ(a(static_cast<Long>(i)), kept ? static_cast<Byte>(i) : 0) << i;
    }
  }

  // Refused before anything is allocated: a two-dimensional preserve, and
  // sizes beyond what an array may hold.
  Array<Single> table({{1, 2}, {1, 3}});
  EXPECT_EQ(error_number([&] { table.redim_preserve(1, 6); }), kSubscriptOutOfRange);
  EXPECT_EQ(table.rank(), 2);
  EXPECT_EQ(error_number([&] { table.redim({0, 65535}, {0, 32768}); }), kOutOfMemory);
  EXPECT_EQ(error_number([] { ByteArray all(kMin, kMax); }), kOutOfMemory);
  EXPECT_EQ(table.ubound(2), 3);
}

TEST(Array, CopiesAreIndependentValues) {
  Array<String> a(0, 1);
  a(0) = u"x";
  Array<String> b = a;
  b(0) = u"y";
  EXPECT_EQ(a(0), u"x");
  EXPECT_FALSE(a == b);

  Array<String> moved = std::move(b);
  EXPECT_EQ(moved(0), u"y");
  EXPECT_EQ(b.rank(), 0);  // NOLINT(bugprone-use-after-move): the source is left without bounds
  EXPECT_EQ(b.size(), 0u);
}

TEST(FixedArray, CheckedAccessAcceptsEnumerations) {
  FixedArray<Single, 0, 1> pair;
  pair(eSC::SCI) = 3.0f;
  EXPECT_EQ(pair(1), 3.0f);
  EXPECT_EQ(error_number([&] { (void)pair(2); }), kSubscriptOutOfRange);
  FixedArray<Long, 1, 40> bands;
  EXPECT_EQ(bands.size(), 40u);
  EXPECT_EQ(error_number([&] { (void)bands(0); }), kSubscriptOutOfRange);
}

}  // namespace
}  // namespace kvdata
