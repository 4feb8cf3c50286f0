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

#include <cstddef>
#include <optional>
#include <span>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/records.hpp"
#include "streams/detail/checked_codec.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {

// A spectrum on the wire: 40 Singles, band 1 first.
inline constexpr std::size_t kSpectrumBytes = 40 * kWireWidth<Single>;

class FieldWriter {
 public:
  // A run of Single values known in advance to take `bytes` bytes: when the
  // array can take the whole run (as it would take the same values written
  // one by one), it is grown once and the values are stored straight into
  // it; otherwise each value goes through the codec, so that the failing one
  // logs its entry and stops the writer as usual. The caller writes exactly
  // `bytes` bytes through the run before using the writer again.
  class Run {
   public:
    Run& put_single(Single v) {
      if (block_) {
        static_cast<void>(store_le(*block_, offset_, v));
        offset_ += kWireWidth<Single>;
      } else {
        out_.put_single(v);
      }
      return *this;
    }

    // values[0], values[1], ...
    Run& put_singles(std::span<const Single> values) {
      if (block_) {
        static_cast<void>(store_le_run(*block_, offset_, values));
        offset_ += kWireWidth<Single> * values.size();
      } else {
        for (const Single v : values) out_.put_single(v);
      }
      return *this;
    }
    // a[0], b[0], a[1], b[1], ...; `a` and `b` have the same length.
    Run& put_interleaved(std::span<const Single> a, std::span<const Single> b) {
      if (block_) {
        static_cast<void>(store_le_interleaved(*block_, offset_, a, b));
        offset_ += 2 * kWireWidth<Single> * a.size();
      } else {
        for (std::size_t i = 0; i < a.size(); ++i) out_.put_single(a[i]).put_single(b[i]);
      }
      return *this;
    }

   private:
    friend class FieldWriter;
    Run(FieldWriter& out, std::optional<std::span<Byte>> block) : out_(out), block_(block) {}
    FieldWriter& out_;
    std::optional<std::span<Byte>> block_;
    std::size_t offset_ = 0;
  };

  FieldWriter(ByteArray& stream, Long& position) : stream_(stream), position_(position) {}

  Run run(std::size_t bytes) {
    std::optional<std::span<Byte>> block;
    if (ok_) block = checked::reserve_run(stream_, position_, bytes);
    if (block) position_ += static_cast<Long>(bytes);
    return Run(*this, block);
  }

  FieldWriter& put_integer(Integer v) { return step(checked::write_integer, v); }
  FieldWriter& put_long(Long v) { return step(checked::write_long, v); }
  FieldWriter& put_single(Single v) { return step(checked::write_single, v); }
  FieldWriter& put_date(Date v) { return step(checked::write_date, v); }
  FieldWriter& put_boolean(bool v) { return step(checked::write_boolean, v); }
  FieldWriter& put_string(const String& v) { return step(checked::write_string, v); }

  // 40 Single values, band 1 first.
  FieldWriter& put_spectrum(const tSpectrum& s) {
    run(kSpectrumBytes).put_singles(s.Data);
    return *this;
  }
  // Spectrum(SCE) then Spectrum(SCI): 80 Single values.
  FieldWriter& put_sc_pair(const tSCPair& p) {
    Run values = run(2 * kSpectrumBytes);
    for (const tSpectrum& s : p.Spectrum) values.put_singles(s.Data);
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
  // A run of Single values known in advance to take `bytes` bytes: when all
  // of them lie inside the array they are read straight from it; otherwise
  // each value goes through the codec, so that the values before the
  // failing one are stored and the failing one logs its entry as usual. The
  // caller reads exactly `bytes` bytes through the run before using the
  // reader again.
  class Run {
   public:
    Run& get_single(Single& v) {
      if (block_) {
        static_cast<void>(load_le(*block_, offset_, v));
        offset_ += kWireWidth<Single>;
      } else {
        in_.get_single(v);
      }
      return *this;
    }

    Run& get_singles(std::span<Single> values) {
      if (block_) {
        static_cast<void>(load_le_run(*block_, offset_, values));
        offset_ += kWireWidth<Single> * values.size();
      } else {
        for (Single& v : values) in_.get_single(v);
      }
      return *this;
    }
    // a[0], b[0], a[1], b[1], ...; `a` and `b` have the same length.
    Run& get_interleaved(std::span<Single> a, std::span<Single> b) {
      if (block_) {
        static_cast<void>(load_le_interleaved(*block_, offset_, a, b));
        offset_ += 2 * kWireWidth<Single> * a.size();
      } else {
        for (std::size_t i = 0; i < a.size(); ++i) in_.get_single(a[i]).get_single(b[i]);
      }
      return *this;
    }

   private:
    friend class FieldReader;
    Run(FieldReader& in, std::optional<std::span<const Byte>> block) : in_(in), block_(block) {}
    FieldReader& in_;
    std::optional<std::span<const Byte>> block_;
    std::size_t offset_ = 0;
  };

  FieldReader(const ByteArray& stream, Long& position) : stream_(stream), position_(position) {}

  Run run(std::size_t bytes) {
    std::optional<std::span<const Byte>> block;
    if (ok_) block = checked::peek_run(stream_, position_, bytes);
    if (block) position_ += static_cast<Long>(bytes);
    return Run(*this, block);
  }

  FieldReader& get_integer(Integer& v) { return step(checked::read_integer, v); }
  FieldReader& get_long(Long& v) { return step(checked::read_long, v); }
  FieldReader& get_single(Single& v) { return step(checked::read_single, v); }
  FieldReader& get_date(Date& v) { return step(checked::read_date, v); }
  FieldReader& get_boolean(bool& v) { return step(checked::read_boolean, v); }
  FieldReader& get_string(String& v) { return step(checked::read_string, v); }

  FieldReader& get_spectrum(tSpectrum& s) {
    run(kSpectrumBytes).get_singles(s.Data);
    return *this;
  }
  FieldReader& get_sc_pair(tSCPair& p) {
    Run values = run(2 * kSpectrumBytes);
    for (tSpectrum& s : p.Spectrum) values.get_singles(s.Data);
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
