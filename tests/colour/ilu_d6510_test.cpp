#include "kvdata/colour/ilu_d6510.hpp"

#include <gtest/gtest.h>

#include <array>
#include <bit>
#include <cmath>
#include <cstdint>
#include <functional>
#include <limits>
#include <memory>

#include "kvdata/automation/create_object.hpp"
#include "kvdata/automation/error.hpp"
#include "support/error_number.hpp"

namespace kvdata {
namespace {

using testing::error_number;
using Bits = std::array<std::uint32_t, 3>;

// Expected values are bit patterns of Singles worked out by hand from the
// weight table with the rounding points of the conversion.
std::uint32_t bits(Single v) {
  return std::bit_cast<std::uint32_t>(v);
}
Bits bits(const Array<Single>& a) {
  return {bits(a(0)), bits(a(1)), bits(a(2))};
}

tSpectrum flat(Single value) {
  tSpectrum s;
  for (Long b = 1; b <= 40; ++b) s.Data(b) = value;
  return s;
}

Array<Single> triple(Single a, Single b, Single c) {
  Array<Single> out(0, 2);
  out(0) = a;
  out(1) = b;
  out(2) = c;
  return out;
}

TEST(ILU_D6510, IsCreatedByNameAndHoldsItsWeights) {
  auto ilu = query<IIlluminant>(CreateObject(u"KVData.ILU_D6510"));
  ASSERT_NE(ilu, nullptr);
  EXPECT_EQ(ilu->Illuminant(), u"ILLUMINANT D65, 1964 OBSERVER, 10nm INTERVAL");

  const Array<Single> y = ilu->Weights(eXYZ::Yaxis);
  ASSERT_EQ(y.lbound(), 1);
  ASSERT_EQ(y.ubound(), 40);
  // 8.855 held as a Single, then / 100: 0.08854999, one step below the
  // Single nearest 0.08855 (3DB559B4).
  EXPECT_EQ(bits(y(20)), 0x3DB559B3u);
  const Array<Single> z = ilu->Weights(eXYZ::Zaxis);
  EXPECT_EQ(bits(z(3)), 0xB7A7C5ADu);  // -0.00002
  EXPECT_FLOAT_EQ(z(10), 0.19888f);
  for (Long b = 22; b <= 40; ++b) EXPECT_EQ(z(b), 0.0f) << b;
  EXPECT_FLOAT_EQ(ilu->Weights(eXYZ::Xaxis)(25), 0.08672f);
  EXPECT_EQ(ilu->PWD(eXYZ::Xaxis), 94.811f);
  EXPECT_EQ(ilu->PWD(eXYZ::Yaxis), 100.0f);
  EXPECT_EQ(ilu->PWD(eXYZ::Zaxis), 107.304f);
}

// Reflectance sets the current XYZ and LAB, bit for bit.
TEST(ILU_D6510, ReflectanceGivesTheRecordedValues) {
  tSpectrum ramp;
  for (Long b = 1; b <= 40; ++b) ramp.Data(b) = 5.0f + 2.25f * static_cast<Single>(b - 1);
  const struct {
    const char* what;
    tSpectrum s;
    Bits xyz, lab;
  } cases[] = {
      // Column sums 94.809, 100.00001, 107.307 as the running sum rounds
      // them; L* 100.00001, a* -0.0035167, b* -0.0018597 (the white point is
      // not the column sums).
      {"flat 100",
       flat(100.0f),
       {0x42BD9E35u, 0x42C80001u, 0x42D69D30u},
       {0x42C80001u, 0xBB667800u, 0xBAF3C000u}},
      // Half of flat 100 exactly; L* 76.06927.
      {"flat 50",
       flat(50.0f),
       {0x423D9E35u, 0x42480001u, 0x42569D30u},
       {0x42982377u, 0xBB379800u, 0xBAC1C000u}},
      // a* and b* well away from zero, in their order: 74.8251, 7.35807, 29.2706.
      {"ramp",
       ramp,
       {0x42407F1Du, 0x42400044u, 0x41DD7CFAu},
       {0x4295A673u, 0x40EB7558u, 0x41EA2A37u}},
      {"zeros: linear branch, f = 16/116 for all three", flat(0.0f), {}, {}},
  };
  auto ilu = ILU_D6510::create();
  EXPECT_EQ(bits(ilu->XYZ()), Bits{});
  EXPECT_EQ(bits(ilu->LAB()), Bits{});
  for (const auto& c : cases) {
    ilu->Reflectance(c.s);
    EXPECT_EQ(bits(ilu->XYZ()), c.xyz) << c.what;
    EXPECT_EQ(bits(ilu->LAB()), c.lab) << c.what;
  }
}

TEST(ILU_D6510, StatelessCallsLeaveTheCurrentValuesAlone) {
  auto ilu = ILU_D6510::create();
  ilu->Reflectance(flat(50.0f));
  const Array<Single> xyz = ilu->XYZ();
  const Array<Single> lab = ilu->LAB();
  Array<Single> out(0, 2);
  // Only band 3 lit: its Z weight is negative and the sum is clamped to 0.
  tSpectrum band3;
  band3.Data(3) = 100.0f;
  ilu->calcXYZ(band3, out);
  EXPECT_EQ(bits(out(2)), 0u);
  EXPECT_EQ(out(0), 0.0f);
  ilu->calcXYZ(flat(100.0f), out);
  EXPECT_EQ(bits(out(0)), 0x42BD9E35u);
  // calcLAB may write over its own input.
  ilu->calcLAB(out, out);
  EXPECT_EQ(bits(out), (Bits{0x42C80001u, 0xBB667800u, 0xBAF3C000u}));
  EXPECT_EQ(ilu->XYZ(), xyz);
  EXPECT_EQ(ilu->LAB(), lab);
  // XYZ hands out a copy.
  Array<Single> copy = ilu->XYZ();
  copy(0) = 1.0f;
  EXPECT_EQ(ilu->XYZ(), xyz);
}

TEST(ILU_D6510, RatioOnTheThresholdTakesTheLinearBranch) {
  auto ilu = ILU_D6510::create();
  Array<Single> lab(0, 2);
  // Y = 0.88560003 gives the ratio 0.008856 exactly: 903.3 * ratio = 7.99963
  // where the power would give 7.99959.
  ilu->calcLAB(triple(0, std::bit_cast<Single>(0x3F62B6AFu), 0), lab);
  EXPECT_EQ(bits(lab), (Bits{0x40FFFCEEu, 0xC209EC61u, 0x415CAD68u}));
  // One Single step higher is above the threshold.
  ilu->calcLAB(triple(0, std::bit_cast<Single>(0x3F62B6B0u), 0), lab);
  EXPECT_EQ(bits(lab), (Bits{0x40FFFCB0u, 0xC209EC8Eu, 0x415CADB0u}));
  // A negative Y stays on the linear branch (no power of a negative number).
  ilu->calcLAB(triple(0, -1.0f, 0), lab);
  EXPECT_FLOAT_EQ(lab(0), -9.033f);
  EXPECT_TRUE(std::isfinite(lab(1)) && std::isfinite(lab(2)));
}

TEST(ILU_D6510, DeltasAreTrialMinusStandard) {
  auto ilu = ILU_D6510::create();
  Array<Single> d(5, 9);  // other bounds: re-created as 0..2
  Array<Single> none;
  Single dE = -1.0f;
  ilu->Deltas(triple(50, 0, 0), triple(53, 4, 0), d, dE);
  EXPECT_EQ(d, triple(3, 4, 0));
  EXPECT_EQ(dE, 5.0f);
  ilu->Deltas(triple(53, 4, 0), triple(50, 0, 0), d, dE);
  EXPECT_EQ(d, triple(-3, -4, 0));
  EXPECT_EQ(dE, 5.0f);
  ilu->Deltas(triple(1, 2, 3), triple(1, 2, 3), none, dE);
  EXPECT_EQ(none, triple(0, 0, 0));
  EXPECT_EQ(dE, 0.0f);
  // The output array may be one of the inputs.
  Array<Single> standard = triple(50, 0, 0);
  ilu->Deltas(standard, triple(50, 3, 4), standard, dE);
  EXPECT_EQ(standard, triple(0, 3, 4));
  EXPECT_EQ(dE, 5.0f);
}

// Arrays that refuse an index raise 9; overflow and NaN raise 6.
TEST(ILU_D6510, RefusedArraysAndOverflowsRaiseTheirNumbers) {
  auto ilu = ILU_D6510::create();
  constexpr Single kInf = std::numeric_limits<Single>::infinity();
  tSpectrum nan = flat(10.0f);
  nan.Data(30) = std::numeric_limits<Single>::quiet_NaN();
  Array<Single> out(0, 2), none, one_based(1, 3), d;
  Single dE = 0.0f;
  const struct {
    const char* what;
    std::function<void()> f;
    Long error;
  } cases[] = {
      {"axis 3", [&] { (void)ilu->Weights(static_cast<eXYZ>(3)); }, kSubscriptOutOfRange},
      {"PWD axis 3", [&] { (void)ilu->PWD(static_cast<eXYZ>(3)); }, kSubscriptOutOfRange},
      {"PWD axis -1", [&] { (void)ilu->PWD(static_cast<eXYZ>(-1)); }, kSubscriptOutOfRange},
      {"XYZ into none", [&] { ilu->calcXYZ(flat(1.0f), none); }, kSubscriptOutOfRange},
      {"XYZ into 1..3", [&] { ilu->calcXYZ(flat(1.0f), one_based); }, kSubscriptOutOfRange},
      {"short trial", [&] { ilu->Deltas(triple(0, 0, 0), Array<Single>(0, 1), d, dE); },
       kSubscriptOutOfRange},
      {"no standard", [&] { ilu->Deltas(Array<Single>(), triple(0, 0, 0), d, dE); },
       kSubscriptOutOfRange},
      {"NaN band", [&] { ilu->Reflectance(nan); }, kOverflow},
      // A huge negative sum is a fault too, not a clamped 0.
      {"-3.3e38", [&] { ilu->calcXYZ(flat(-3.3e38f), out); }, kOverflow},
      {"infinite Y", [&] { ilu->calcLAB(triple(0, kInf, 0), out); }, kOverflow},
      {"delta overflow", [&] { ilu->Deltas(triple(-3e38f, 0, 0), triple(3e38f, 0, 0), d, dE); },
       kOverflow},
  };
  for (const auto& c : cases) EXPECT_EQ(error_number(c.f), c.error) << c.what;

  // Elements before the failing one keep their new values, and an input
  // refused before anything is written leaves the output alone.
  Array<Single> short_out(0, 1);
  EXPECT_EQ(error_number([&] { ilu->calcXYZ(flat(100.0f), short_out); }), kSubscriptOutOfRange);
  EXPECT_EQ(bits(short_out(0)), 0x42BD9E35u);
  EXPECT_EQ(bits(short_out(1)), 0x42C80001u);
  Array<Single> short_lab(0, 0);
  EXPECT_EQ(error_number([&] { ilu->calcLAB(triple(95, 100, 107), short_lab); }),
            kSubscriptOutOfRange);
  EXPECT_NEAR(short_lab(0), 100.0f, 1e-3f);
  out(0) = 7.0f;
  EXPECT_EQ(error_number([&] { ilu->calcLAB(Array<Single>(0, 1), out); }), kSubscriptOutOfRange);
  EXPECT_EQ(out(0), 7.0f);
  // The Z weights sum to 1.07: Z overflows where X and Y do not, and X and Y
  // stay written.
  EXPECT_EQ(error_number([&] { ilu->calcXYZ(flat(3.3e38f), out); }), kOverflow);
  EXPECT_GT(out(0), 3.0e38f);
  EXPECT_GT(out(1), 3.0e38f);
}

}  // namespace
}  // namespace kvdata
