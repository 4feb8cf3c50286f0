#include "kvdata/automation/array.hpp"

#include <gtest/gtest.h>

#include <functional>
#include <iterator>
#include <limits>
#include <utility>
#include <vector>

#include "support/error_number.hpp"

#include "kvdata/foundation/enums.hpp"

namespace kvdata {
namespace {

using testing::error_number;

constexpr Long kMax = std::numeric_limits<Long>::max();
constexpr Long kMin = std::numeric_limits<Long>::min();

TEST(Array, RefusedIndexesAndSizesRaiseTheirNumbers) {
  const Array<Long> none;
  const Array<Single> a(1, 40);
  const Array<Single> t({{1, 2}, {1, 3}});
  Array<Single> table({{1, 2}, {1, 3}});
  const FixedArray<Single, 0, 1> pair;
  const FixedArray<Long, 1, 40> bands;
  const struct {
    const char* what;
    std::function<void()> f;
    Long error;
  } cases[] = {
      {"lbound without bounds", [&] { (void)none.lbound(); }, kSubscriptOutOfRange},
      {"ubound without bounds", [&] { (void)none.ubound(); }, kSubscriptOutOfRange},
      {"element without bounds", [&] { (void)none(0); }, kSubscriptOutOfRange},
      {"below lbound", [&] { (void)a(0); }, kSubscriptOutOfRange},
      {"above ubound", [&] { (void)a(41); }, kSubscriptOutOfRange},
      {"two indexes for one", [&] { (void)a(1, 1); }, kSubscriptOutOfRange},
      {"no second dimension", [&] { (void)a.lbound(2); }, kSubscriptOutOfRange},
      {"upper below lower", [] { Array<Byte> bad(5, 3); }, kSubscriptOutOfRange},
      {"first index of two", [&] { (void)t(3, 1); }, kSubscriptOutOfRange},
      {"second index of two", [&] { (void)t(1, 4); }, kSubscriptOutOfRange},
      {"one index for two", [&] { (void)t(1); }, kSubscriptOutOfRange},
      {"fixed above", [&] { (void)pair(2); }, kSubscriptOutOfRange},
      {"fixed below", [&] { (void)bands(0); }, kSubscriptOutOfRange},
      {"preserve of two dimensions", [&] { table.redim_preserve(1, 6); }, kSubscriptOutOfRange},
      {"2^31 elements of two dimensions",
       [&] {
         table.redim({0, 65535}, {0, 32768});
       },
       kOutOfMemory},
      {"every Long", [] { ByteArray all(kMin, kMax); }, kOutOfMemory},
  };
  for (const auto& c : cases) EXPECT_EQ(error_number(c.f), c.error) << c.what;
  // Refused before anything changed.
  EXPECT_EQ(table.rank(), 2);
  EXPECT_EQ(table.ubound(2), 3);
}

TEST(Array, LayoutKeepsTheFirstIndexFastest) {
  Array<Single> a(1, 40);
  EXPECT_EQ(a(1), 0.0f);
  a(40) = 2.5f;
  EXPECT_EQ(a.data()[39], 2.5f);
  Array<Long> negative(-3, -1);
  negative(-3) = 7;
  EXPECT_EQ(negative.data()[0], 7);

  Array<Single> t({{1, 2}, {1, 3}});
  EXPECT_EQ(t.rank(), 2);
  EXPECT_EQ(t.lbound(2), 1);
  EXPECT_EQ(t.ubound(2), 3);
  t(2, 1) = 5.0f;
  t(1, 3) = 6.0f;
  EXPECT_EQ(t.data()[1], 5.0f);
  EXPECT_EQ(t.data()[4], 6.0f);

  FixedArray<Single, 0, 1> pair;
  pair(eSC::SCI) = 3.0f;
  EXPECT_EQ(pair(1), 3.0f);
  EXPECT_EQ((FixedArray<Long, 1, 40>{}.size()), 40u);

  // Dimensioned with no elements is not the same as never dimensioned.
  Array<Long> empty(0, -1);
  EXPECT_EQ(empty.rank(), 1);
  EXPECT_EQ(empty.size(), 0u);
  EXPECT_FALSE(empty == Array<Long>());
}

// One array through a run of redims: its bounds and every element after each.
TEST(Array, RedimPreserveKeepsWhatStaysInsideAndZeroesTheRest) {
  ByteArray a(1, 4);
  for (Long i = 1; i <= 4; ++i) a(i) = static_cast<Byte>(i);
  const struct {
    Long lower, upper;
    std::vector<Byte> after;
  } steps[] = {
      {1, 6, {1, 2, 3, 4, 0, 0}},
      {1, 2, {1, 2}},
      {1, 3, {1, 2, 0}},     // the regrown element is zero, not the old 3
      {0, 3, {0, 1, 2, 0}},  // a moved lower bound: elements keep their indices
  };
  for (const auto& s : steps) {
    a.redim_preserve(s.lower, s.upper);
    EXPECT_EQ(a.lbound(), s.lower);
    EXPECT_EQ(std::vector<Byte>(a.begin(), a.end()), s.after) << s.lower << ".." << s.upper;
  }
  a.redim(0, 1);
  EXPECT_EQ(a(1), 0);
  a.erase();
  EXPECT_EQ(a.rank(), 0);
  a.redim_preserve(0, 0);  // an array without bounds gets them
  EXPECT_EQ(a.ubound(), 0);
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

}  // namespace
}  // namespace kvdata
