#pragma once
// Test support for the stream tests: collecting event-log entries, a
// reference encoder that lays out expected bytes value by value (as a
// layout table reads, independent of the library's own encoder), and
// the largest allocation made while a piece of code runs.
//
//   LogCapture log;   ...   EXPECT_EQ(log.entries.size(), 1u);
//   Wire w;  w.l32(1).str("abc");   // 01 00 00 00 03 00 00 00 61 62 63

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <string>
#include <string_view>
#include <vector>

#include "kvdata/kvdata.hpp"

namespace kvdata::testing {

class LogCapture {
 public:
  LogCapture() {
    previous_ = EventLog::SetSink([this](const String& text) { entries.push_back(text); });
  }
  ~LogCapture() { EventLog::SetSink(previous_); }
  LogCapture(const LogCapture&) = delete;
  LogCapture& operator=(const LogCapture&) = delete;

  std::vector<String> entries;

 private:
  EventLog::Sink previous_;
};

// Expected stream bytes, built by hand: each call appends one value's
// little-endian image.
struct Wire {
  std::vector<Byte> bytes;

  Wire& raw(std::initializer_list<int> values) {
    for (int v : values) bytes.push_back(static_cast<Byte>(v));
    return *this;
  }
  Wire& le(std::uint64_t bits, int width) {
    for (int i = 0; i < width; ++i) bytes.push_back(static_cast<Byte>(bits >> (8 * i)));
    return *this;
  }
  Wire& i16(std::int16_t v) { return le(static_cast<std::uint16_t>(v), 2); }
  Wire& l32(std::int32_t v) { return le(static_cast<std::uint32_t>(v), 4); }
  Wire& f32(float v) { return le(std::bit_cast<std::uint32_t>(v), 4); }
  Wire& f64(double v) { return le(std::bit_cast<std::uint64_t>(v), 8); }
  Wire& boolean(bool v) { return raw({v ? 1 : 0}); }
  // Text of one-byte characters: the count, then the bytes.
  Wire& str(std::string_view text) {
    l32(static_cast<std::int32_t>(text.size()));
    for (char c : text) bytes.push_back(static_cast<Byte>(c));
    return *this;
  }
  // UTF-16 code units, little-endian.
  Wire& units(std::u16string_view text) {
    for (char16_t c : text) le(c, 2);
    return *this;
  }
  Wire& zeros(std::size_t n) {
    bytes.insert(bytes.end(), n, Byte{0});
    return *this;
  }
  std::size_t size() const { return bytes.size(); }
};

// The elements of a stream from lower to upper bound.
inline std::vector<Byte> contents(const ByteArray& stream) {
  return std::vector<Byte>(stream.begin(), stream.end());
}

// A stream with lower bound `lower` holding `bytes` (its upper bound may be
// the highest Long).
inline ByteArray stream_of(const std::vector<Byte>& bytes, Long lower = 0) {
  ByteArray stream(lower, lower + (static_cast<Long>(bytes.size()) - 1));
  std::copy(bytes.begin(), bytes.end(), stream.begin());
  return stream;
}

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
