// Field codec readers at a fuzzed Position. The input names a short sequence
// of readers, then frames a stream (fuzz_support.hpp). Each reader runs twice,
// as the public operation and as its checked variant, and the two must agree.
// A read that fails must log exactly one entry and leave Value and Position
// as documented; a read that succeeds must have taken exactly its bytes from
// inside the array, and the value must write back to the same bytes and read
// back to the same bits.

#include <bit>
#include <cstdint>
#include <cstring>

#include "fuzz_support.hpp"
#include "streams/detail/checked_codec.hpp"

namespace {

using namespace kvdata;
using fuzz::log_entries;

// Bit-exact equality, so that NaNs with the same payload compare equal.
bool same(Integer a, Integer b) {
  return a == b;
}
bool same(Long a, Long b) {
  return a == b;
}
bool same(Single a, Single b) {
  return std::bit_cast<std::uint32_t>(a) == std::bit_cast<std::uint32_t>(b);
}
bool same(Date a, Date b) {
  return std::bit_cast<std::uint64_t>(a.days) == std::bit_cast<std::uint64_t>(b.days);
}
bool same(bool a, bool b) {
  return a == b;
}
bool same(const String& a, const String& b) {
  return a == b;
}

// Initial values that no successful read is forced to produce, so that an
// unchanged Value is told apart from a value read.
template <class T>
T sentinel();
template <>
Integer sentinel<Integer>() {
  return 0x1234;
}
template <>
Long sentinel<Long>() {
  return 0x12345678;
}
template <>
Single sentinel<Single>() {
  return 12.5f;
}
template <>
Date sentinel<Date>() {
  return Date{4321.25};
}
template <>
bool sentinel<bool>() {
  return true;
}
template <>
String sentinel<String>() {
  return u"sentinel";
}

template <class T>
struct Ops;
template <>
struct Ops<Integer> {
  static constexpr long long kWidth = 2;
  static void read(const ByteArray& s, Long& p, Integer& v) { IntegerFromArray(s, p, v); }
  static bool checked_read(const ByteArray& s, Long& p, Integer& v) {
    return checked::read_integer(s, p, v);
  }
  static bool write(Integer v, ByteArray& s, Long& p) { return checked::write_integer(v, s, p); }
};
template <>
struct Ops<Long> {
  static constexpr long long kWidth = 4;
  static void read(const ByteArray& s, Long& p, Long& v) { LongFromArray(s, p, v); }
  static bool checked_read(const ByteArray& s, Long& p, Long& v) {
    return checked::read_long(s, p, v);
  }
  static bool write(Long v, ByteArray& s, Long& p) { return checked::write_long(v, s, p); }
};
template <>
struct Ops<Single> {
  static constexpr long long kWidth = 4;
  static void read(const ByteArray& s, Long& p, Single& v) { SingleFromArray(s, p, v); }
  static bool checked_read(const ByteArray& s, Long& p, Single& v) {
    return checked::read_single(s, p, v);
  }
  static bool write(Single v, ByteArray& s, Long& p) { return checked::write_single(v, s, p); }
};
template <>
struct Ops<Date> {
  static constexpr long long kWidth = 8;
  static void read(const ByteArray& s, Long& p, Date& v) { DateFromArray(s, p, v); }
  static bool checked_read(const ByteArray& s, Long& p, Date& v) {
    return checked::read_date(s, p, v);
  }
  static bool write(Date v, ByteArray& s, Long& p) { return checked::write_date(v, s, p); }
};
template <>
struct Ops<bool> {
  static constexpr long long kWidth = 1;
  static void read(const ByteArray& s, Long& p, bool& v) { BooleanFromArray(s, p, v); }
  static bool checked_read(const ByteArray& s, Long& p, bool& v) {
    return checked::read_boolean(s, p, v);
  }
  static bool write(bool v, ByteArray& s, Long& p) { return checked::write_boolean(v, s, p); }
};
template <>
struct Ops<String> {
  static void read(const ByteArray& s, Long& p, String& v) { StringFromArray(s, p, v); }
  static bool checked_read(const ByteArray& s, Long& p, String& v) {
    return checked::read_string(s, p, v);
  }
  static bool write(const String& v, ByteArray& s, Long& p) {
    return checked::write_string(v, s, p);
  }
};

// The element at index `i` of a bounded array that holds it.
Byte element(const ByteArray& s, long long i) {
  return s.data()[static_cast<std::size_t>(i - s.lbound())];
}

template <class T>
void one_read(const fuzz::Framed& in, Long& position) {
  const Long p0 = position;
  const T v0 = sentinel<T>();

  // The public operation.
  T value = v0;
  const std::size_t e0 = log_entries();
  Ops<T>::read(in.stream, position, value);
  const std::size_t logged = log_entries() - e0;

  // The checked variant from the same start must do exactly the same.
  T checked_value = v0;
  Long checked_position = p0;
  const std::size_t e1 = log_entries();
  const bool ok = Ops<T>::checked_read(in.stream, checked_position, checked_value);
  KVDATA_FUZZ_CHECK(log_entries() - e1 == logged, "checked variant logged differently");
  KVDATA_FUZZ_CHECK(checked_position == position, "checked variant moved Position differently");
  KVDATA_FUZZ_CHECK(same(checked_value, value), "checked variant read another value");

  const long long moved = static_cast<long long>(position) - p0;
  if (!ok) {
    KVDATA_FUZZ_CHECK(logged == 1, "a failed read must log exactly one entry");
    if constexpr (std::is_same_v<T, String>) {
      // Either the count failed (empty text, Position kept) or the body
      // failed (Value kept, Position just after the count).
      const bool count_failed = moved == 0 && value.empty();
      const bool body_failed = moved == 4 && same(value, v0);
      KVDATA_FUZZ_CHECK(count_failed || body_failed, "failed string read left the wrong state");
    } else {
      KVDATA_FUZZ_CHECK(moved == 0, "failed read moved Position");
      KVDATA_FUZZ_CHECK(same(value, v0), "failed read changed Value");
    }
    return;
  }

  KVDATA_FUZZ_CHECK(logged == 0, "a successful read logged an entry");
  // Everything taken lies inside the array.
  KVDATA_FUZZ_CHECK(in.stream.has_bounds(), "read from an array without bounds");
  KVDATA_FUZZ_CHECK(moved >= 0 && moved <= in.available(), "read past the array's end");
  if constexpr (std::is_same_v<T, String>) {
    KVDATA_FUZZ_CHECK(moved == 4 + static_cast<long long>(value.size()),
                      "string read took another number of bytes than its text");
  } else {
    KVDATA_FUZZ_CHECK(moved == Ops<T>::kWidth, "read took another width than its type's");
  }

  // Round trip: the value writes back to the same bytes (a Boolean to its
  // canonical byte) and reads back to the same bits.
  ByteArray out = fuzz::empty_stream();
  Long end = 0;
  KVDATA_FUZZ_CHECK(Ops<T>::write(value, out, end), "a value read could not be written");
  KVDATA_FUZZ_CHECK(end == moved, "written width differs from the width read");
  for (long long i = 0; i < moved; ++i) {
    Byte expected = element(in.stream, p0 + i);
    if constexpr (std::is_same_v<T, bool>) expected = expected == 1 ? 1 : 0;
    KVDATA_FUZZ_CHECK(out.data()[static_cast<std::size_t>(i)] == expected,
                      "written bytes differ from the bytes read");
  }
  T again = sentinel<T>();
  Long back = 0;
  KVDATA_FUZZ_CHECK(Ops<T>::checked_read(out, back, again), "written value does not read back");
  KVDATA_FUZZ_CHECK(back == end && same(again, value), "value changed on its round trip");
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

// Input: one byte with the number of readers (1 to 8), that many reader
// bytes (mod 6: Integer, Long, Single, Date, Boolean, String), then the
// framed stream.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  fuzz::Input head(data, size);
  const int count = head.byte() % 8 + 1;
  std::uint8_t readers[8] = {};
  for (int i = 0; i < count; ++i) readers[i] = head.byte();
  const std::size_t used = std::min<std::size_t>(size, static_cast<std::size_t>(count) + 1);
  const fuzz::Framed in = fuzz::frame(data + used, size - used);

  Long position = in.position;
  for (int i = 0; i < count; ++i) {
    switch (readers[i] % 6) {
      case 0:
        one_read<Integer>(in, position);
        break;
      case 1:
        one_read<Long>(in, position);
        break;
      case 2:
        one_read<Single>(in, position);
        break;
      case 3:
        one_read<Date>(in, position);
        break;
      case 4:
        one_read<bool>(in, position);
        break;
      default:
        one_read<String>(in, position);
        break;
    }
  }
  KVDATA_FUZZ_CHECK(in.unchanged(), "a reader changed the stream");
  return 0;
}
