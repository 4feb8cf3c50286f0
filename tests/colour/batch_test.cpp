#include "kvdata/colour/batch.hpp"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <functional>
#include <limits>
#include <random>
#include <span>
#include <vector>

#include "kvdata/automation/error.hpp"
#include "kvdata/colour/ilu_d6510.hpp"
#include "support/error_number.hpp"

namespace kvdata {
namespace {

std::uint32_t bits(Single v) {
  return std::bit_cast<std::uint32_t>(v);
}

// Spectra of several kinds, so that every branch is met: ordinary
// reflectances, dark ones whose ratios straddle the threshold, negative
// values (clamped sums), huge values (overflow), and raw bit patterns
// (NaN, infinities, subnormals).
std::vector<tSpectrum> random_spectra(std::size_t count, std::uint32_t seed) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<Single> percent(0.0f, 100.0f);
  std::uniform_real_distribution<Single> dark(0.0f, 2.0f);
  std::uniform_real_distribution<Single> signed_small(-5.0f, 5.0f);
  std::uniform_real_distribution<Single> exponent(-40.0f, 38.0f);
  std::uniform_int_distribution<std::uint32_t> raw;
  std::vector<tSpectrum> out(count);
  for (std::size_t k = 0; k < count; ++k) {
    tSpectrum& s = out[k];
    const std::size_t kind = k % 8;
    for (Long b = 1; b <= 40; ++b) {
      Single v = 0.0f;
      switch (kind) {
        case 0:
        case 1:
          v = percent(rng);
          break;
        case 2:
          v = dark(rng);
          break;
        case 3:
          // Flat-ish and very dark: Y/Yn close to 0.008856.
          v = 0.8856f * (1.0f + 0.001f * signed_small(rng));
          break;
        case 4:
          v = signed_small(rng);
          break;
        case 5:
          v = std::pow(10.0f, exponent(rng));
          break;
        case 6:
          // Near the largest Single: some sums overflow, some do not.
          v = 3.17e38f * (1.0f + 0.01f * signed_small(rng));
          break;
        default:
          v = (rng() % 8 == 0) ? std::bit_cast<Single>(raw(rng)) : percent(rng);
          break;
      }
      s.Data(b) = v;
    }
  }
  return out;
}

TEST(CalcXyzLabD6510, MatchesTheIlluminantBitForBit) {
  auto ilu = ILU_D6510::create();
  // Not a multiple of the lane count: the last block is partly filled.
  std::vector<tSpectrum> spectra = random_spectra(20011, 20240611u);
  // Non-finite values in bands whose weights are all zero fault too.
  spectra[16].Data(1) = std::numeric_limits<Single>::quiet_NaN();
  spectra[17].Data(2) = std::numeric_limits<Single>::infinity();
  spectra[18].Data(3) = -std::numeric_limits<Single>::infinity();
  spectra[19].Data(40) = std::numeric_limits<Single>::quiet_NaN();
  const std::size_t n = spectra.size();
  std::vector<Single> flat(40 * n);
  for (std::size_t k = 0; k < n; ++k) {
    for (Long b = 1; b <= 40; ++b)
      flat[40 * k + static_cast<std::size_t>(b - 1)] = spectra[k].Data(b);
  }
  std::vector<Single> xyz(3 * n), lab(3 * n), xyz2(3 * n), lab2(3 * n);
  const std::size_t faults = calc_xyz_lab_d6510(flat, xyz, lab);
  EXPECT_EQ(calc_xyz_lab_d6510(spectra, xyz2, lab2), faults);

  std::size_t expected_faults = 0, linear = 0, clamped = 0;
  Array<Single> x(0, 2), c(0, 2);
  for (std::size_t k = 0; k < n; ++k) {
    bool fault = false;
    try {
      ilu->calcXYZ(spectra[k], x);
      ilu->calcLAB(x, c);
    } catch (const Error& e) {
      ASSERT_EQ(e.number(), kOverflow);
      fault = true;
    }
    for (int i = 0; i < 3; ++i) {
      const std::size_t at = 3 * k + static_cast<std::size_t>(i);
      ASSERT_EQ(bits(xyz[at]), bits(xyz2[at])) << k;
      ASSERT_EQ(bits(lab[at]), bits(lab2[at])) << k;
      if (fault) {
        ASSERT_TRUE(std::isnan(xyz[at]) && std::isnan(lab[at])) << k;
      } else {
        ASSERT_EQ(bits(xyz[at]), bits(x(i))) << "spectrum " << k << " component " << i;
        ASSERT_EQ(bits(lab[at]), bits(c(i))) << "spectrum " << k << " component " << i;
      }
    }
    expected_faults += fault ? 1 : 0;
    if (!fault && x(1) / 100.0f <= 0.008856f) ++linear;
    if (!fault && (x(0) == 0.0f || x(2) == 0.0f)) ++clamped;
  }
  EXPECT_EQ(faults, expected_faults);
  for (std::size_t k = 16; k < 20; ++k) EXPECT_TRUE(std::isnan(lab[3 * k])) << k;
  EXPECT_FALSE(std::isnan(lab[3 * 20]));
  // The sample met every branch.
  EXPECT_GT(faults, 500u);
  EXPECT_GT(linear, 100u);
  EXPECT_GT(clamped, 100u);
}

TEST(CalcXyzLabD6510, RefusesMismatchedOrOverlappingBuffers) {
  std::vector<Single> spectra(40 * 3, 50.0f);
  std::vector<Single> xyz(9, -1.0f), lab(9, -1.0f), small(8, -1.0f);
  const std::span<const Single> all(spectra);
  const std::function<void()> refused[] = {
      [&] { (void)calc_xyz_lab_d6510(all, small, lab); },
      [&] { (void)calc_xyz_lab_d6510(all, xyz, small); },
      [&] { (void)calc_xyz_lab_d6510(all.first(41), xyz, lab); },  // not whole spectra
      [&] { (void)calc_xyz_lab_d6510(all, std::span<Single>(spectra).first(9), lab); },
      [&] { (void)calc_xyz_lab_d6510(all, xyz, std::span<Single>(xyz).first(9)); },
  };
  for (const auto& f : refused) EXPECT_EQ(testing::error_number(f), kInvalidProcedureCall);
  for (Single v : xyz) EXPECT_EQ(v, -1.0f);
  for (Single v : lab) EXPECT_EQ(v, -1.0f);

  EXPECT_EQ(calc_xyz_lab_d6510(std::span<const Single>(), std::span<Single>(), std::span<Single>()),
            0u);
  EXPECT_EQ(calc_xyz_lab_d6510(spectra, xyz, lab), 0u);
  EXPECT_EQ(bits(xyz[1]), 0x42480001u);  // flat 50: Y 50.000004
  EXPECT_EQ(bits(lab[6]), 0x42982377u);  // L* 76.06927 for the third spectrum
}

}  // namespace
}  // namespace kvdata
