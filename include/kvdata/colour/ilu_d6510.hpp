#pragma once
// CIE illuminant D65 with the CIE 1964 10-degree observer at a 10 nm
// interval, over the 40 bands 360..750 nm, reached through IIlluminant.
//
//   std::shared_ptr<kvdata::IIlluminant> ilu = kvdata::ILU_D6510::create();
//   kvdata::Array<kvdata::Single> xyz(0, 2);  ilu->calcXYZ(spectrum, xyz);

#include <array>
#include <memory>

#include "kvdata/colour/iilluminant.hpp"

namespace kvdata {

// Holds its own weight table (the D65/10 weights divided by 100, as Singles)
// and white point (94.811, 100, 107.304), and the XYZ and LAB of the last
// spectrum assigned to Reflectance. Sums of products run in double and are
// rounded to Single after every band; negative sums become 0. A ratio to
// the white point above 0.008856 (strictly) takes the power 0.33333331,
// anything else the linear branch.
//
// Threads: the const members (calcXYZ, calcLAB, XYZ, Weights, ...) may run
// on one object from any number of threads at once; Reflectance changes the
// object and needs the caller's lock when the object is shared.
class ILU_D6510 final : public IIlluminant {
 public:
  static std::shared_ptr<ILU_D6510> create();

  ILU_D6510();

 protected:
  void IIlluminant_Deltas(const Array<Single>& LABStandard, const Array<Single>& LABTrial,
                          Array<Single>& dLAB, Single& dE) const override;
  String IIlluminant_Illuminant() const override;
  Array<Single> IIlluminant_Weights(const eXYZ& XYZ) const override;
  Single IIlluminant_PWD(const eXYZ& XYZ) const override;
  // A failure leaves the current XYZ and LAB partly updated.
  void IIlluminant_Reflectance(const tSpectrum& value) override;
  Array<Single> IIlluminant_XYZ() const override;
  Array<Single> IIlluminant_LAB() const override;
  void IIlluminant_calcXYZ(const tSpectrum& RefIn, Array<Single>& XYZOut) const override;
  void IIlluminant_calcLAB(const Array<Single>& XYZIn, Array<Single>& LABOut) const override;

 private:
  std::array<std::array<Single, 40>, 3> weights_{};  // [component][band - 1]
  std::array<Single, 3> white_point_{};
  Array<Single> xyz_{0, 2};
  Array<Single> lab_{0, 2};
};

}  // namespace kvdata
