#include "kvdata/colour/batch.hpp"

#include <algorithm>
#include <array>
#include <bit>
#include <cstdint>
#include <functional>
#include <limits>

#include "colour/detail/d65_10.hpp"
#include "colour/detail/power_lanes.hpp"
#include "kvdata/automation/error.hpp"

namespace kvdata {
namespace {

namespace d65 = detail::d65_10;

// Spectra converted side by side. Each running sum is a serial chain (it is
// rounded to Single after every band), so the lanes are what runs in
// parallel: every inner loop below runs over the lanes.
using d65::FlagLanes;
using d65::kLanes;
using d65::SingleLanes;
constexpr std::size_t kBands = d65::kBands;

// Stored weights widened to double, [component][band - 1].
constexpr auto kWeights = [] {
  std::array<std::array<Double, kBands>, d65::kComponents> w{};
  for (std::size_t c = 0; c < d65::kComponents; ++c) {
    for (std::size_t b = 1; b <= kBands; ++b) w[c][b - 1] = static_cast<Double>(d65::weight(c, b));
  }
  return w;
}();

// Bands whose weight is 0 add an exact zero to a finite sum, so they are
// skipped: all three components are summed over bands 3..21, X and Y over
// 22..40; bands 1 and 2, and Z beyond band 21, weigh nothing.
//
// Faults: a non-finite value in bands 3..40 makes the X sum non-finite (a
// zero weight times an infinity is NaN, and nothing turns NaN or an
// infinity back into a finite sum), so checking the three sums before the
// clamp catches it along with overflow. Bands 1 and 2 are checked on their own.
constexpr std::size_t kFirstBand = 3;
constexpr std::size_t kLastZBand = 21;
constexpr std::size_t kSummedBands = kBands - kFirstBand + 1;
constexpr bool weights_vanish_outside_summed_bands() {
  for (std::size_t c = 0; c < d65::kComponents; ++c) {
    for (std::size_t b = 1; b < kFirstBand; ++b) {
      if (kWeights[c][b - 1] != 0.0) return false;
    }
  }
  for (std::size_t b = kLastZBand + 1; b <= kBands; ++b) {
    if (kWeights[2][b - 1] != 0.0) return false;
  }
  return true;
}
static_assert(weights_vanish_outside_summed_bands());

constexpr std::uint32_t kExponentBits = 0x7f800000u;

// 1 for infinities and NaN, else 0.
inline std::int32_t non_finite(Single v) {
  return static_cast<std::int32_t>((std::bit_cast<std::uint32_t>(v) & kExponentBits) ==
                                   kExponentBits);
}

// One block of spectra, lane l being spectrum first + l. Left uninitialised:
// every element is written before it is read.
struct Block {
  alignas(64) std::array<SingleLanes, kSummedBands> refl;  // [band - 3][lane]
  alignas(64) std::array<SingleLanes, 3> xyz;
  alignas(64) std::array<SingleLanes, 3> lab;
  alignas(64) FlagLanes fault;
};

// Copies spectra [first, first + n) into the lanes (zeros beyond n).
// `spectrum(k)` points at band 1 of spectrum k, the 40 bands contiguous.
template <class SpectrumReader>
void load(Block& blk, const SpectrumReader& spectrum, std::size_t first, std::size_t n) {
  for (std::size_t l = 0; l < kLanes; ++l) {
    if (l < n) {
      const Single* src = spectrum(first + l);
      blk.fault[l] = non_finite(src[0]) | non_finite(src[1]);
      for (std::size_t b = kFirstBand; b <= kBands; ++b) blk.refl[b - kFirstBand][l] = src[b - 1];
    } else {
      blk.fault[l] = 0;
      for (std::size_t b = kFirstBand; b <= kBands; ++b) blk.refl[b - kFirstBand][l] = 0.0f;
    }
  }
}

void sum_xyz(Block& blk) {
  alignas(64) SingleLanes x{};
  alignas(64) SingleLanes y{};
  alignas(64) SingleLanes z{};
  for (std::size_t b = kFirstBand; b <= kLastZBand; ++b) {
    const Double wx = kWeights[0][b - 1];
    const Double wy = kWeights[1][b - 1];
    const Double wz = kWeights[2][b - 1];
    const auto& r = blk.refl[b - kFirstBand];
    for (std::size_t l = 0; l < kLanes; ++l) {
      const auto rl = static_cast<Double>(r[l]);
      x[l] = static_cast<Single>(static_cast<Double>(x[l]) + wx * rl);
      y[l] = static_cast<Single>(static_cast<Double>(y[l]) + wy * rl);
      z[l] = static_cast<Single>(static_cast<Double>(z[l]) + wz * rl);
    }
  }
  for (std::size_t b = kLastZBand + 1; b <= kBands; ++b) {
    const Double wx = kWeights[0][b - 1];
    const Double wy = kWeights[1][b - 1];
    const auto& r = blk.refl[b - kFirstBand];
    for (std::size_t l = 0; l < kLanes; ++l) {
      const auto rl = static_cast<Double>(r[l]);
      x[l] = static_cast<Single>(static_cast<Double>(x[l]) + wx * rl);
      y[l] = static_cast<Single>(static_cast<Double>(y[l]) + wy * rl);
    }
  }
  for (std::size_t l = 0; l < kLanes; ++l) {
    blk.fault[l] |= non_finite(x[l]) | non_finite(y[l]) | non_finite(z[l]);
    blk.xyz[0][l] = x[l] < 0.0f ? 0.0f : x[l];
    blk.xyz[1][l] = y[l] < 0.0f ? 0.0f : y[l];
    blk.xyz[2][l] = z[l] < 0.0f ? 0.0f : z[l];
  }
}

void xyz_to_lab(Block& blk) {
  alignas(64) std::array<SingleLanes, 3> ratio;
  for (std::size_t c = 0; c < 3; ++c) {
    for (std::size_t l = 0; l < kLanes; ++l) ratio[c][l] = d65::ratio(blk.xyz[c][l], c);
  }
  // Powers of the lanes above the threshold.
  alignas(64) std::array<SingleLanes, 3> f;
  alignas(64) SingleLanes l_star;
  alignas(64) SingleLanes unused;
  (void)d65::exact_power_lanes(ratio[0], f[0], unused);
  (void)d65::exact_power_lanes(ratio[1], f[1], l_star);
  (void)d65::exact_power_lanes(ratio[2], f[2], unused);
  // The linear branch, and the differences.
  for (std::size_t c = 0; c < 3; ++c) {
    for (std::size_t l = 0; l < kLanes; ++l) {
      const Single linear = d65::linear_f(ratio[c][l]);
      f[c][l] = d65::above_threshold(ratio[c][l]) ? f[c][l] : linear;
    }
  }
  for (std::size_t l = 0; l < kLanes; ++l) {
    const Single linear = d65::linear_l(ratio[1][l]);
    blk.lab[0][l] = d65::above_threshold(ratio[1][l]) ? l_star[l] : linear;
    blk.lab[1][l] = d65::lab_a(f[0][l], f[1][l]);
    blk.lab[2][l] = d65::lab_b(f[1][l], f[2][l]);
  }
}

// Converts spectra [first, first + n), n <= kLanes, writing three values
// per spectrum to `xyz` and `lab`. Returns the number of faults among them.
template <class SpectrumReader>
std::size_t convert_block(const SpectrumReader& spectrum, std::size_t first, std::size_t n,
                          Single* xyz, Single* lab) {
  Block blk;
  load(blk, spectrum, first, n);
  sum_xyz(blk);
  xyz_to_lab(blk);

  std::size_t faults = 0;
  constexpr Single kNaN = std::numeric_limits<Single>::quiet_NaN();
  for (std::size_t l = 0; l < n; ++l) {
    Single* x = xyz + 3 * (first + l);
    Single* c = lab + 3 * (first + l);
    if (blk.fault[l] != 0) {
      ++faults;
      std::fill_n(x, 3, kNaN);
      std::fill_n(c, 3, kNaN);
      continue;
    }
    for (std::size_t i = 0; i < 3; ++i) {
      x[i] = blk.xyz[i][l];
      c[i] = blk.lab[i][l];
    }
  }
  return faults;
}

// True when the two spans share any storage.
template <class T, class U>
bool overlap(std::span<T> a, std::span<U> b) {
  if (a.empty() || b.empty()) return false;
  const std::less<const void*> less;
  const void* a_begin = a.data();
  const void* a_end = a.data() + a.size();
  const void* b_begin = b.data();
  const void* b_end = b.data() + b.size();
  return less(a_begin, b_end) && less(b_begin, a_end);
}

template <class Spectra, class SpectrumReader>
std::size_t convert_all(std::span<const Spectra> spectra, std::size_t count,
                        const SpectrumReader& spectrum, std::span<Single> xyz,
                        std::span<Single> lab) {
  if (xyz.size() != 3 * count || lab.size() != 3 * count || overlap(spectra, xyz) ||
      overlap(spectra, lab) || overlap(xyz, lab)) {
    raise(kInvalidProcedureCall);
  }
  std::size_t faults = 0;
  for (std::size_t first = 0; first < count; first += kLanes) {
    const std::size_t n = std::min<std::size_t>(kLanes, count - first);
    faults += convert_block(spectrum, first, n, xyz.data(), lab.data());
  }
  return faults;
}

}  // namespace

std::size_t calc_xyz_lab_d6510(std::span<const Single> spectra, std::span<Single> xyz,
                               std::span<Single> lab) {
  if (spectra.size() % kBands != 0) raise(kInvalidProcedureCall);
  const Single* data = spectra.data();
  return convert_all(
      spectra, spectra.size() / kBands, [data](std::size_t k) { return data + k * kBands; }, xyz,
      lab);
}

std::size_t calc_xyz_lab_d6510(std::span<const tSpectrum> spectra, std::span<Single> xyz,
                               std::span<Single> lab) {
  const tSpectrum* data = spectra.data();
  return convert_all(
      spectra, spectra.size(), [data](std::size_t k) { return data[k].Data.data(); }, xyz, lab);
}

}  // namespace kvdata
