#pragma once
// An illuminant/observer combination: spectra to CIE XYZ and CIELAB, and
// CIELAB differences. ILU_D6510 is the implementation.
//
//   auto ilu = kvdata::ILU_D6510::create();
//   ilu->Reflectance(spectrum);  ilu->LAB()(0);   // L* of the spectrum

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/enums.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Members in slot order. Nothing is trapped: every failure reaches the caller
// as a kvdata::Error, and what was written before it stays written. Arrays of
// components take the indices 0..2 by eXYZ or eLAB; a caller's array that
// has no bounds or does not accept 0, 1 and 2 raises error 9 when the
// missing index is reached. A Single result that overflows or is not a
// number raises error 6.
class IIlluminant : public virtual Object {
 public:
  // Re-creates `dLAB` as (0 To 2) holding trial minus standard per component
  // and sets `dE` to the CIE 1976 colour difference. `dLAB` may be one of
  // the inputs.
  void Deltas(const Array<Single>& LABStandard, const Array<Single>& LABTrial, Array<Single>& dLAB,
              Single& dE) const {
    IIlluminant_Deltas(LABStandard, LABTrial, dLAB, dE);
  }
  // The name of the illuminant, observer and interval.
  String Illuminant() const { return IIlluminant_Illuminant(); }
  // A new (1 To 40) array of the weights of one component, as applied to
  // percent reflectance. A component outside 0..2 raises error 9.
  Array<Single> Weights(const eXYZ& XYZ) const { return IIlluminant_Weights(XYZ); }
  // One component of the white point; outside 0..2 raises error 9.
  Single PWD(const eXYZ& XYZ) const { return IIlluminant_PWD(XYZ); }
  // Sets the current XYZ and LAB from a spectrum (percent reflectance).
  void Reflectance(const tSpectrum& value) { IIlluminant_Reflectance(value); }
  // A (0 To 2) copy of the current XYZ; zeros before the first spectrum.
  Array<Single> XYZ() const { return IIlluminant_XYZ(); }
  // A (0 To 2) copy of the current LAB; zeros before the first spectrum.
  Array<Single> LAB() const { return IIlluminant_LAB(); }
  // Writes X, Y, Z of `RefIn` into XYZOut(0..2) without resizing it.
  // Leaves the current XYZ and LAB alone.
  void calcXYZ(const tSpectrum& RefIn, Array<Single>& XYZOut) const {
    IIlluminant_calcXYZ(RefIn, XYZOut);
  }
  // Writes L*, a*, b* of XYZIn(0..2) into LABOut(0..2) without resizing it.
  // Leaves the current XYZ and LAB alone. The two arrays may be the same.
  void calcLAB(const Array<Single>& XYZIn, Array<Single>& LABOut) const {
    IIlluminant_calcLAB(XYZIn, LABOut);
  }

 protected:
  virtual void IIlluminant_Deltas(const Array<Single>& LABStandard, const Array<Single>& LABTrial,
                                  Array<Single>& dLAB, Single& dE) const = 0;
  virtual String IIlluminant_Illuminant() const = 0;
  virtual Array<Single> IIlluminant_Weights(const eXYZ& XYZ) const = 0;
  virtual Single IIlluminant_PWD(const eXYZ& XYZ) const = 0;
  virtual void IIlluminant_Reflectance(const tSpectrum& value) = 0;
  virtual Array<Single> IIlluminant_XYZ() const = 0;
  virtual Array<Single> IIlluminant_LAB() const = 0;
  virtual void IIlluminant_calcXYZ(const tSpectrum& RefIn, Array<Single>& XYZOut) const = 0;
  virtual void IIlluminant_calcLAB(const Array<Single>& XYZIn, Array<Single>& LABOut) const = 0;
};

}  // namespace kvdata
