#pragma once
// One instrument profile: the correction tables of the instrument `ISN` as
// created at `Created`, with the band-width table and the three wavelength
// Longs that travel with them. The object stores and streams the values; it
// applies no correction itself.
//
//   auto profile = kvdata::KVProfile::create();
//   profile->WhiteCorrection(kvdata::eSC::SCI, 40, 1.25f);  profile->StreamOut(bytes, pos);
//
// Stream form, from Position: the stamp 1.4 (Single), StartWL, EndWl and
// Interval (Longs), the profile record stream (ISN, Created, Validated, the
// type name "tOVProfileDataV1", the four tables interleaved), then the 80
// band-width values, SCE bands 1..40 then SCI bands 1..40. A new profile
// takes 1649 bytes; ISN adds its text bytes.

#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/enums.hpp"
#include "kvdata/foundation/ikv_obj.hpp"
#include "kvdata/foundation/ikv_profile.hpp"
#include "kvdata/foundation/ikv_stream.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Identity: ObjType and Description "Profile", ID a String Variant holding
// ISN, DateCreated a Date Variant holding Created. A new profile holds an
// empty ISN, the zero date, False, and zeros everywhere else.
//
// StreamOut sets the stream to run from 0 to Position + 2000 (working room),
// writes the encoding, and cuts the stream to run from 0 to the final
// Position (one spare byte after the encoding). A negative Position, or one
// so large that Position + 2000 passes the Long range, is refused: False,
// with the stream and Position unchanged. The result is False also when a
// value could not be written; errors of the resize (no memory) reach the
// caller.
//
// StreamIn refuses any stamp but 1.4 (False, Position past the stamp, the
// object unchanged). It then reads StartWL, EndWl and Interval straight into
// the object, reads the record (which replaces ISN, Created and Validated as
// far as it got), takes the four tables only from a record read whole, and
// only then reads the band-width values. It stops with False at the first
// value it cannot read or at a record that fails (such as another type name);
// what it replaced before that stays replaced, nothing after it is touched.
//
// StreamLen is the Position that StreamOut reaches from 0 in a new array;
// the object is not changed.
class KVProfile : public IKVStream, public IKVObj, public IKVProfile {
 public:
  static std::shared_ptr<KVProfile> create();

 protected:
  bool IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) override;
  bool IKVStream_StreamOut(ByteArray& bytStream, Long& Position) override;
  Long IKVStream_StreamLen() const override;

  String IKVObj_ObjType() const override;
  String IKVObj_Description() const override;
  Variant IKVObj_ID() const override;
  Variant IKVObj_DateCreated() const override;

  String IKVProfile_ISN() const override { return isn_; }
  void IKVProfile_ISN(const String& value) override { isn_ = value; }
  Date IKVProfile_Created() const override { return created_; }
  void IKVProfile_Created(Date value) override { created_ = value; }
  bool IKVProfile_Validated() const override { return validated_; }
  void IKVProfile_Validated(bool value) override { validated_ = value; }
  Long IKVProfile_StartWL() const override { return start_wl_; }
  void IKVProfile_StartWL(Long value) override { start_wl_ = value; }
  Long IKVProfile_EndWl() const override { return end_wl_; }
  void IKVProfile_EndWl(Long value) override { end_wl_ = value; }
  Long IKVProfile_Interval() const override { return interval_; }
  void IKVProfile_Interval(Long value) override { interval_ = value; }
  Single IKVProfile_WhiteCorrection(const eSC& sc, const Long& WL) const override;
  void IKVProfile_WhiteCorrection(const eSC& sc, const Long& WL, const Single& value) override;
  Single IKVProfile_WaveCorrection(const eSC& sc, const Long& WL) const override;
  void IKVProfile_WaveCorrection(const eSC& sc, const Long& WL, const Single& value) override;
  Single IKVProfile_LinearCorrection(const eSC& sc, const Long& WL) const override;
  void IKVProfile_LinearCorrection(const eSC& sc, const Long& WL, const Single& value) override;
  Single IKVProfile_DarkCorrection(const eSC& sc, const Long& WL) const override;
  void IKVProfile_DarkCorrection(const eSC& sc, const Long& WL, const Single& value) override;
  Single IKVProfile_BandWidthCorrection(const eSC& sc, const Long& WL) const override;
  void IKVProfile_BandWidthCorrection(const eSC& sc, const Long& WL, const Single& value) override;

 private:
  KVProfile() = default;

  // The encoding of StreamOut; const so that StreamLen can run it on a scratch array.
  bool write_stream(ByteArray& stream, Long& position) const;

  String isn_;
  Date created_;
  bool validated_ = false;
  tOVProfileDataV1 tables_;                 // wCal, wave, Linear, Dark
  FixedArray<tSpectrum, 0, 1> band_width_;  // indexed by eSC, bands 1..40
  Long start_wl_ = 0;
  Long end_wl_ = 0;
  Long interval_ = 0;
};

}  // namespace kvdata
