#pragma once
// An instrument profile: the instrument's serial number, the moment the
// profile was created, whether it was validated, five spectral correction
// tables (one value per geometry and band) and three wavelength Longs.
//
//   profile->WhiteCorrection(kvdata::eSC::SCI, 40, 1.25f);
//   profile->WhiteCorrection(kvdata::eSC::SCI, 40) == 1.25f;

#include "kvdata/automation/object.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/enums.hpp"

namespace kvdata {

// Every correction member addresses one value by geometry `sc` (SCE or SCI)
// and band number `WL` (1 to 40, not a wavelength in nanometres). A `sc`
// outside SCE..SCI or a `WL` outside 1..40 raises error 9 and changes
// nothing. The other members store and return their values unchanged.
class IKVProfile : public virtual Object {
 public:
  String ISN() const { return IKVProfile_ISN(); }
  void ISN(const String& value) { IKVProfile_ISN(value); }
  Date Created() const { return IKVProfile_Created(); }
  void Created(Date value) { IKVProfile_Created(value); }
  bool Validated() const { return IKVProfile_Validated(); }
  void Validated(bool value) { IKVProfile_Validated(value); }
  Long StartWL() const { return IKVProfile_StartWL(); }
  void StartWL(Long value) { IKVProfile_StartWL(value); }
  Long EndWl() const { return IKVProfile_EndWl(); }
  void EndWl(Long value) { IKVProfile_EndWl(value); }
  Long Interval() const { return IKVProfile_Interval(); }
  void Interval(Long value) { IKVProfile_Interval(value); }

  // The white calibration correction.
  Single WhiteCorrection(const eSC& sc, const Long& WL) const {
    return IKVProfile_WhiteCorrection(sc, WL);
  }
  void WhiteCorrection(const eSC& sc, const Long& WL, const Single& value) {
    IKVProfile_WhiteCorrection(sc, WL, value);
  }
  // The wavelength correction.
  Single WaveCorrection(const eSC& sc, const Long& WL) const {
    return IKVProfile_WaveCorrection(sc, WL);
  }
  void WaveCorrection(const eSC& sc, const Long& WL, const Single& value) {
    IKVProfile_WaveCorrection(sc, WL, value);
  }
  // The linearity correction.
  Single LinearCorrection(const eSC& sc, const Long& WL) const {
    return IKVProfile_LinearCorrection(sc, WL);
  }
  void LinearCorrection(const eSC& sc, const Long& WL, const Single& value) {
    IKVProfile_LinearCorrection(sc, WL, value);
  }
  // The dark correction.
  Single DarkCorrection(const eSC& sc, const Long& WL) const {
    return IKVProfile_DarkCorrection(sc, WL);
  }
  void DarkCorrection(const eSC& sc, const Long& WL, const Single& value) {
    IKVProfile_DarkCorrection(sc, WL, value);
  }
  // The band-width correction.
  Single BandWidthCorrection(const eSC& sc, const Long& WL) const {
    return IKVProfile_BandWidthCorrection(sc, WL);
  }
  void BandWidthCorrection(const eSC& sc, const Long& WL, const Single& value) {
    IKVProfile_BandWidthCorrection(sc, WL, value);
  }

 protected:
  virtual String IKVProfile_ISN() const = 0;
  virtual void IKVProfile_ISN(const String& value) = 0;
  virtual Date IKVProfile_Created() const = 0;
  virtual void IKVProfile_Created(Date value) = 0;
  virtual bool IKVProfile_Validated() const = 0;
  virtual void IKVProfile_Validated(bool value) = 0;
  virtual Long IKVProfile_StartWL() const = 0;
  virtual void IKVProfile_StartWL(Long value) = 0;
  virtual Long IKVProfile_EndWl() const = 0;
  virtual void IKVProfile_EndWl(Long value) = 0;
  virtual Long IKVProfile_Interval() const = 0;
  virtual void IKVProfile_Interval(Long value) = 0;
  virtual Single IKVProfile_WhiteCorrection(const eSC& sc, const Long& WL) const = 0;
  virtual void IKVProfile_WhiteCorrection(const eSC& sc, const Long& WL, const Single& value) = 0;
  virtual Single IKVProfile_WaveCorrection(const eSC& sc, const Long& WL) const = 0;
  virtual void IKVProfile_WaveCorrection(const eSC& sc, const Long& WL, const Single& value) = 0;
  virtual Single IKVProfile_LinearCorrection(const eSC& sc, const Long& WL) const = 0;
  virtual void IKVProfile_LinearCorrection(const eSC& sc, const Long& WL, const Single& value) = 0;
  virtual Single IKVProfile_DarkCorrection(const eSC& sc, const Long& WL) const = 0;
  virtual void IKVProfile_DarkCorrection(const eSC& sc, const Long& WL, const Single& value) = 0;
  virtual Single IKVProfile_BandWidthCorrection(const eSC& sc, const Long& WL) const = 0;
  virtual void IKVProfile_BandWidthCorrection(const eSC& sc, const Long& WL,
                                              const Single& value) = 0;
};

}  // namespace kvdata
