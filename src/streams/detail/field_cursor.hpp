#pragma once
// A running Position over a byte stream that writes or reads a sequence of
// field-codec values and stops at the first one that fails. Record streams
// and object streams are written as straight sequences of these calls and ask
// ok() once at the end. Each failed value has logged its one event-log entry;
// nothing is attempted after it, so a short stream costs one entry, not one
// per remaining value.
//
//   kvdata::detail::FieldReader in(bytes, pos);
//   in.get_string(station.StationGUID).get_string(station.StationName);
//   if (!in.ok()) return false;

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/records.hpp"
#include "streams/detail/checked_codec.hpp"

namespace kvdata::detail {

class FieldWriter {
 public:
  FieldWriter(ByteArray& stream, Long& position) : stream_(stream), position_(position) {}

  FieldWriter& put_integer(Integer v) { return step(checked::write_integer, v); }
  FieldWriter& put_long(Long v) { return step(checked::write_long, v); }
  FieldWriter& put_single(Single v) { return step(checked::write_single, v); }
  FieldWriter& put_date(Date v) { return step(checked::write_date, v); }
  FieldWriter& put_boolean(bool v) { return step(checked::write_boolean, v); }
  FieldWriter& put_string(const String& v) { return step(checked::write_string, v); }

  // 40 Single values, band 1 first.
  FieldWriter& put_spectrum(const tSpectrum& s) {
    for (const Single v : s.Data) put_single(v);
    return *this;
  }
  // Spectrum(SCE) then Spectrum(SCI): 80 Single values.
  FieldWriter& put_sc_pair(const tSCPair& p) {
    for (const tSpectrum& s : p.Spectrum) put_spectrum(s);
    return *this;
  }

  // True while every value so far was written.
  bool ok() const { return ok_; }

 private:
  template <class F, class V>
  FieldWriter& step(F write, const V& v) {
    ok_ = ok_ && write(v, stream_, position_);
    return *this;
  }

  ByteArray& stream_;
  Long& position_;
  bool ok_ = true;
};

// Each get_ stores its value straight into the target as soon as that value
// is read; a value that fails leaves its target as the codec leaves it.
class FieldReader {
 public:
  FieldReader(const ByteArray& stream, Long& position) : stream_(stream), position_(position) {}

  FieldReader& get_integer(Integer& v) { return step(checked::read_integer, v); }
  FieldReader& get_long(Long& v) { return step(checked::read_long, v); }
  FieldReader& get_single(Single& v) { return step(checked::read_single, v); }
  FieldReader& get_date(Date& v) { return step(checked::read_date, v); }
  FieldReader& get_boolean(bool& v) { return step(checked::read_boolean, v); }
  FieldReader& get_string(String& v) { return step(checked::read_string, v); }

  FieldReader& get_spectrum(tSpectrum& s) {
    for (Single& v : s.Data) get_single(v);
    return *this;
  }
  FieldReader& get_sc_pair(tSCPair& p) {
    for (tSpectrum& s : p.Spectrum) get_spectrum(s);
    return *this;
  }

  // True while every value so far was read.
  bool ok() const { return ok_; }

 private:
  template <class F, class V>
  FieldReader& step(F read, V& v) {
    ok_ = ok_ && read(stream_, position_, v);
    return *this;
  }

  const ByteArray& stream_;
  Long& position_;
  bool ok_ = true;
};

}  // namespace kvdata::detail
