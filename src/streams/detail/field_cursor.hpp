#pragma once
// A running Position over a byte stream that writes or reads a sequence of
// field-codec values and stops at the first one that fails. Record streams
// and object streams are written as straight sequences of these calls and ask
// ok() once at the end. Each failed value has logged its one event-log entry;
// nothing is attempted after it, so a short stream costs one entry, not one
// per remaining value.
//
//   kvdata::detail::FieldReader in(bytes, pos);
//   in.get_string(station.StationGUID, "StationGUID").get_string(station.StationName, ...);
//   if (!in.ok()) return false;

#include <cstddef>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <type_traits>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/record_fields.hpp"
#include "kvdata/foundation/records.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "streams/detail/checked_codec.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/detail/observe.hpp"

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
// is read; a value that fails leaves its target as the codec leaves it. Each
// names its field (the record's field name, or what the bytes are); while an
// observer is installed, every value read is reported to it under that name
// and the first failure is refused there with what was expected.
class FieldReader {
 public:
  // The path of a value inside the record being read: `field(index)` inside
  // `record` (empty: directly in the record entered last).
  struct Slot {
    std::string_view record;
    std::string_view field;
  };

  // A run of Single values known in advance to take `bytes` bytes: when all
  // of them lie inside the array (and nobody observes the reader) they are
  // read straight from it; otherwise each value goes through the codec, so
  // that the values before the failing one are stored, the failing one logs
  // its entry as usual, and an observer sees them value by value. The
  // caller reads exactly `bytes` bytes through the run before using the
  // reader again.
  class Run {
   public:
    // values[0] .. values[n - 1] as name(1) .. name(n).
    Run& get_singles(std::span<Single> values, std::string_view name) {
      if (block_) {
        static_cast<void>(load_le_run(*block_, offset_, values));
        offset_ += kWireWidth<Single> * values.size();
      } else {
        const Slot slot{{}, name};
        const std::span<Single> arrays[] = {values};
        in_.ok_ =
            in_.ok_ && read_each(in_.stream_, in_.position_, in_.observer_, arrays, {&slot, 1});
      }
      return *this;
    }
    // a[0], b[0], a[1], b[1], ...; `a` and `b` have the same length.
    Run& get_interleaved(std::span<Single> a, std::span<Single> b, const Slot& a_slot,
                         const Slot& b_slot) {
      if (block_) {
        static_cast<void>(load_le_interleaved(*block_, offset_, a, b));
        offset_ += 2 * kWireWidth<Single> * a.size();
      } else {
        const std::span<Single> arrays[] = {a, b};
        const Slot slots[] = {a_slot, b_slot};
        in_.ok_ = in_.ok_ && read_each(in_.stream_, in_.position_, in_.observer_, arrays, slots);
      }
      return *this;
    }
    // arrays[0][0], arrays[1][0], ..., arrays[0][1], arrays[1][1], ...: the
    // values of arrays of one length side by side, each in its slot.
    Run& get_side_by_side(std::span<const std::span<Single>> arrays, std::span<const Slot> slots) {
      if (block_) {
        const std::size_t n = arrays.empty() ? 0 : arrays[0].size();
        for (std::size_t i = 0; i < n; ++i) {
          for (const std::span<Single>& values : arrays) {
            static_cast<void>(load_le(*block_, offset_, values[i]));
            offset_ += kWireWidth<Single>;
          }
        }
      } else {
        in_.ok_ = in_.ok_ && read_each(in_.stream_, in_.position_, in_.observer_, arrays, slots);
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

  FieldReader(const ByteArray& stream, Long& position)
      : stream_(stream), position_(position), observer_(stream_observer()) {}

  Run run(std::size_t bytes) {
    std::optional<std::span<const Byte>> block;
    if (ok_ && observer_ == nullptr) block = checked::peek_run(stream_, position_, bytes);
    if (block) position_ += static_cast<Long>(bytes);
    return Run(*this, block);
  }

  FieldReader& get_integer(Integer& v, std::string_view name) {
    return step(checked::read_integer, v, name);
  }
  FieldReader& get_long(Long& v, std::string_view name) {
    return step(checked::read_long, v, name);
  }
  FieldReader& get_single(Single& v, std::string_view name) {
    return step(checked::read_single, v, name);
  }
  FieldReader& get_date(Date& v, std::string_view name) {
    return step(checked::read_date, v, name);
  }
  FieldReader& get_boolean(bool& v, std::string_view name) {
    return step(checked::read_boolean, v, name);
  }
  FieldReader& get_string(String& v, std::string_view name) {
    return step(checked::read_string, v, name);
  }
  // Element `index` of a fixed array of Singles.
  FieldReader& get_single(Single& v, std::string_view name, Long index) {
    return step(checked::read_single, v, name, index);
  }
  FieldReader& get_single(Single& v, const Slot& slot, Long index) {
    if (observer_ == nullptr || slot.record.empty()) return get_single(v, slot.field, index);
    const ObservedRecord inside(observer_, slot.record);
    return get_single(v, slot.field, index);
  }

  // The field `Member` of `record`, under its described name:
  // in.get<&tStation::StationGUID>(station).
  template <auto Member, class R>
  FieldReader& get(R& record) {
    constexpr std::string_view name = field_name<Member>();
    auto& v = record.*Member;
    using V = std::remove_cvref_t<decltype(v)>;
    if constexpr (std::is_same_v<V, String>) {
      return get_string(v, name);
    } else if constexpr (std::is_same_v<V, Long>) {
      return get_long(v, name);
    } else if constexpr (std::is_same_v<V, Integer>) {
      return get_integer(v, name);
    } else if constexpr (std::is_same_v<V, Single>) {
      return get_single(v, name);
    } else if constexpr (std::is_same_v<V, Date>) {
      return get_date(v, name);
    } else if constexpr (std::is_same_v<V, bool>) {
      return get_boolean(v, name);
    } else {
      static_assert(std::is_same_v<V, tSpectrum>, "a field the codec does not read");
      return get_spectrum(v, name);
    }
  }

  // 40 Single values, band 1 first, as name(1) .. name(40).
  FieldReader& get_spectrum(tSpectrum& s, std::string_view name) {
    run(kSpectrumBytes).get_singles(s.Data, name);
    return *this;
  }
  // Spectrum(SCE) then Spectrum(SCI), each named by its geometry: SCE(1) ..
  // SCE(40), SCI(1) .. SCI(40).
  FieldReader& get_sc_pair(tSCPair& p) {
    Run values = run(2 * kSpectrumBytes);
    for (const eSC sc : {eSC::SCE, eSC::SCI}) values.get_singles(p.Spectrum(sc).Data, sc_name(sc));
    return *this;
  }

  // True while every value so far was read.
  bool ok() const { return ok_; }
  Long position() const { return position_; }
  // The observer watching this reader, or nullptr.
  StreamObserver* observer() const { return observer_; }

  // "SCE", "SCI".
  static constexpr std::string_view sc_name(eSC sc) { return sc == eSC::SCE ? kSCEName : kSCIName; }

 private:
  template <class F, class V>
  FieldReader& step(F read, V& v, std::string_view name, std::optional<Long> index = {}) {
    if (observer_ != nullptr) [[unlikely]] {
      ok_ = ok_ && observed_step(read, stream_, position_, v, *observer_, name, index);
    } else {
      ok_ = ok_ && read(stream_, position_, v);
    }
    return *this;
  }

  // The step while someone watches: the value read is reported, or the
  // failure refused with what was expected. Static, so that the reader
  // itself never leaves the caller's registers on the path nobody watches.
  template <class F, class V>
  [[gnu::noinline, gnu::cold]] static bool observed_step(F read, const ByteArray& stream,
                                                         Long& position, V& v,
                                                         StreamObserver& observer,
                                                         std::string_view name,
                                                         std::optional<Long> index) {
    const Long start = position;
    if (!read(stream, position, v)) {
      refuse(
          &observer, start, name, [&] { return expected_at<V>(stream, start); }, index);
      return false;
    }
    FieldValue value;
    if constexpr (std::is_same_v<V, String>) {
      value = std::u16string_view(v);
    } else {
      value = v;
    }
    report(&observer, name, start, position - start, value, index);
    return true;
  }

  // The values of a run one by one, side by side as get_side_by_side takes
  // them, each at its index from 1 in its slot, observed or not. False at
  // the first that fails.
  [[gnu::noinline]] static bool read_each(const ByteArray& stream, Long& position,
                                          StreamObserver* observer,
                                          std::span<const std::span<Single>> arrays,
                                          std::span<const Slot> slots) {
    const std::size_t n = arrays.empty() ? 0 : arrays[0].size();
    for (std::size_t i = 0; i < n; ++i) {
      for (std::size_t j = 0; j < arrays.size(); ++j) {
        Single& v = arrays[j][i];
        bool ok = false;
        if (observer == nullptr) {
          ok = checked::read_single(stream, position, v);
        } else {
          const Slot& slot = slots[j];
          const ObservedRecord inside(slot.record.empty() ? nullptr : observer, slot.record);
          ok = observed_step(checked::read_single, stream, position, v, *observer, slot.field,
                             static_cast<Long>(i + 1));
        }
        if (!ok) return false;
      }
    }
    return true;
  }

  // What a value of type V needed at `start`, where it failed.
  template <class V>
  static std::string expected_at(const ByteArray& stream, Long start) {
    const std::size_t left = bytes_from(stream, start);
    if constexpr (std::is_same_v<V, String>) {
      Long count = 0;
      if (!load_le(stream, start, count)) {
        return "a String count (Long): " + shortfall(kWireWidth<Long>, left);
      }
      if (count < 0) return "a String count of 0 or more; found " + std::to_string(count);
      return "a String count that fits: it says " + std::to_string(count) +
             " bytes of text follow, but only " + std::to_string(left - kWireWidth<Long>) +
             " are left";
    } else if constexpr (std::is_same_v<V, bool>) {
      return "a Boolean: " + shortfall(1, left);
    } else if constexpr (std::is_same_v<V, Integer>) {
      return "an Integer: " + shortfall(kWireWidth<V>, left);
    } else if constexpr (std::is_same_v<V, Long>) {
      return "a Long: " + shortfall(kWireWidth<V>, left);
    } else if constexpr (std::is_same_v<V, Single>) {
      return "a Single: " + shortfall(kWireWidth<V>, left);
    } else {
      return "a Date: " + shortfall(kWireWidth<V>, left);
    }
  }

  static constexpr std::string_view kSCEName = *member_name(eSC::SCE);
  static constexpr std::string_view kSCIName = *member_name(eSC::SCI);

  const ByteArray& stream_;
  Long& position_;
  StreamObserver* observer_;
  bool ok_ = true;
};

}  // namespace kvdata::detail
