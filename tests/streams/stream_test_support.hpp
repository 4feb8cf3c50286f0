#pragma once
// Test support for the stream tests: sample records with a distinct value in
// every field, their expected images, and the largest allocation made while a
// piece of code runs. Byte builders and log capture: support/streams.hpp.

#include "kvdata/kvdata.hpp"
#include "support/streams.hpp"

namespace kvdata::testing {

// A spectrum whose 40 values are distinct and exact: base + band / 4.
inline tSpectrum spectrum(float base) {
  tSpectrum s;
  for (Long band = 1; band <= kBandCount; ++band)
    s.Data(band) = base + static_cast<float>(band) / 4;
  return s;
}
inline tSCPair sc_pair(float base) {
  tSCPair p;
  p.Spectrum(eSC::SCE) = spectrum(base);
  p.Spectrum(eSC::SCI) = spectrum(base + 1000);
  return p;
}
// The expected image of a spectrum: band 1 first.
inline Wire& put(Wire& w, const tSpectrum& s) {
  for (const float v : s.Data) w.f32(v);
  return w;
}
inline Wire& put(Wire& w, const tSCPair& p) {
  put(w, p.Spectrum(eSC::SCE));
  return put(w, p.Spectrum(eSC::SCI));
}

// Sample records with a distinct value in every field.
inline tOVProfileDataV1 profile_tables() {
  tOVProfileDataV1 t;
  for (Long k = 0; k <= 1; ++k) {
    t.wCal(k) = spectrum(static_cast<float>(k) * 1000 + 100);
    t.wave(k) = spectrum(static_cast<float>(k) * 1000 + 200);
    t.Linear(k) = spectrum(static_cast<float>(k) * 1000 + 300);
    t.Dark(k) = spectrum(static_cast<float>(k) * 1000 + 400);
  }
  return t;
}

inline tOVProfile profile() {
  tOVProfile pro;
  pro.ISN = u"SN42";
  pro.Created = Date{45123.5};
  pro.Validated = true;
  pro.ProfileData = Variant(profile_tables());
  return pro;
}

// Every text longer than its field or shorter than it.
inline tUser user() {
  tUser u;
  u.USERID = u"ABCDEFGHIJ";  // cut to 8
  u.UserNumber = 0x01020304;
  u.LastName = u"Smith";                             // padded to 30
  u.FirstName = u"Bartholomew-Maximilian-Johannes";  // 31, cut to 30
  u.UserPWD = u"pw";
  u.UserMail = u"a@b.c";
  u.OrgID = -2;
  u.RoleCode = u"AB";  // cut to 1
  u.Disabled = u"Y";
  return u;
}
inline tOrganization organization() {
  return tOrganization{
      7, u"Kelvanto Calibration Laboratories of the Northern Region, Ltd", 1, -1, u"KL", u"Y"};
}

// Largest single allocation requested since the last reset (the stream
// tests replace the global allocation functions to observe it).
void reset_largest_allocation();
std::size_t largest_allocation();

}  // namespace kvdata::testing
