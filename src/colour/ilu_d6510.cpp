#include "kvdata/colour/ilu_d6510.hpp"

#include <cmath>
#include <cstddef>

#include "colour/detail/d65_10.hpp"

namespace kvdata {
namespace {

namespace d65 = detail::d65_10;

inline constexpr char16_t kIlluminantName[] = u"ILLUMINANT D65, 1964 OBSERVER, 10nm INTERVAL";

// The component as an index 0..2; anything else raises error 9.
std::size_t component_index(eXYZ component) {
  const auto c = static_cast<Long>(component);
  if (c < 0 || c >= static_cast<Long>(d65::kComponents)) raise(kSubscriptOutOfRange);
  return static_cast<std::size_t>(c);
}

}  // namespace

std::shared_ptr<ILU_D6510> ILU_D6510::create() {
  return std::make_shared<ILU_D6510>();
}

ILU_D6510::ILU_D6510() {
  for (std::size_t c = 0; c < d65::kComponents; ++c) {
    weights_[c] = d65::kTable[c];
    white_point_[c] = d65::kWhitePoint[c];
  }
  // From here on the weights apply to percent reflectance directly.
  for (auto& row : weights_) {
    for (Single& w : row) w = static_cast<Single>(static_cast<Double>(w) / 100.0);
  }
}

void ILU_D6510::IIlluminant_Deltas(const Array<Single>& LABStandard, const Array<Single>& LABTrial,
                                   Array<Single>& dLAB, Single& dE) const {
  // Copies first: the caller may pass one of the inputs as dLAB, which is
  // re-created before the differences are taken.
  const Array<Single> standard = LABStandard;
  const Array<Single> trial = LABTrial;
  dLAB.redim(0, 2);
  for (Long i = 0; i < 3; ++i) {
    dLAB(i) = d65::checked(
        static_cast<Single>(static_cast<Double>(trial(i)) - static_cast<Double>(standard(i))));
  }
  const auto dl = static_cast<Double>(dLAB(0));
  const auto da = static_cast<Double>(dLAB(1));
  const auto db = static_cast<Double>(dLAB(2));
  dE = d65::checked(static_cast<Single>(std::sqrt(da * da + dl * dl + db * db)));
}

String ILU_D6510::IIlluminant_Illuminant() const {
  return kIlluminantName;
}

Array<Single> ILU_D6510::IIlluminant_Weights(const eXYZ& XYZ) const {
  const std::size_t c = component_index(XYZ);
  Array<Single> out(1, static_cast<Long>(d65::kBands));
  for (std::size_t b = 1; b <= d65::kBands; ++b) out(static_cast<Long>(b)) = weights_[c][b - 1];
  return out;
}

Single ILU_D6510::IIlluminant_PWD(const eXYZ& XYZ) const {
  return white_point_[component_index(XYZ)];
}

void ILU_D6510::IIlluminant_Reflectance(const tSpectrum& value) {
  IIlluminant_calcXYZ(value, xyz_);
  IIlluminant_calcLAB(xyz_, lab_);
}

Array<Single> ILU_D6510::IIlluminant_XYZ() const {
  return xyz_;
}

Array<Single> ILU_D6510::IIlluminant_LAB() const {
  return lab_;
}

void ILU_D6510::IIlluminant_calcXYZ(const tSpectrum& RefIn, Array<Single>& XYZOut) const {
  for (std::size_t c = 0; c < d65::kComponents; ++c) {
    Single sum = 0.0f;
    for (std::size_t b = 1; b <= d65::kBands; ++b) {
      sum = d65::accumulate(sum, weights_[c][b - 1], RefIn.Data(static_cast<Long>(b)));
    }
    // An overflowed or NaN sum is a fault before the clamp could hide it.
    XYZOut(static_cast<Long>(c)) = d65::clamp_sum(d65::checked(sum));
  }
}

void ILU_D6510::IIlluminant_calcLAB(const Array<Single>& XYZIn, Array<Single>& LABOut) const {
  std::array<Single, 3> ratio{};
  std::array<Double, 3> power{};
  for (std::size_t i = 0; i < 3; ++i) {
    ratio[i] = d65::checked(static_cast<Single>(static_cast<Double>(XYZIn(static_cast<Long>(i))) /
                                                static_cast<Double>(white_point_[i])));
    // No power of a ratio at or below the threshold is taken (nor of a negative one).
    if (d65::above_threshold(ratio[i])) power[i] = d65::power(ratio[i]);
  }
  LABOut(0) = d65::checked(d65::lab_l(ratio[1], power[1]));
  const Single f0 = d65::checked(d65::lab_f(ratio[0], power[0]));
  const Single f1 = d65::checked(d65::lab_f(ratio[1], power[1]));
  const Single f2 = d65::checked(d65::lab_f(ratio[2], power[2]));
  LABOut(1) = d65::checked(d65::lab_a(f0, f1));
  LABOut(2) = d65::checked(d65::lab_b(f1, f2));
}

}  // namespace kvdata
