#pragma once
// Support shared by the stream and object tests: expected bytes laid out value
// by value by hand (independent of the library's own encoder), streams built
// from bytes, an object's whole encoding as a fingerprint of its state, and
// event-log capture.
//
//   LogCapture log;   ...   EXPECT_EQ(log.entries.size(), 1u);
//   Wire w;  w.l32(1).str("abc");   // 01 00 00 00 03 00 00 00 61 62 63

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <string_view>
#include <vector>

#include "kvdata/kvdata.hpp"

namespace kvdata::testing {

using Bytes = std::vector<Byte>;

// Collects event-log entries for the life of the object.
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

// Expected stream bytes: each call appends one value's little-endian image.
struct Wire {
  Bytes bytes;

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
  Wire& zeros(std::size_t n) {
    bytes.insert(bytes.end(), n, Byte{0});
    return *this;
  }
  std::size_t size() const { return bytes.size(); }
};

// A stream with lower bound `lower` holding `bytes` (its upper bound may be
// the highest Long).
inline ByteArray stream_of(const Bytes& bytes, Long lower = 0) {
  ByteArray stream(lower, lower + (static_cast<Long>(bytes.size()) - 1));
  std::copy(bytes.begin(), bytes.end(), stream.begin());
  return stream;
}

// The elements of a stream from lower to upper bound.
inline Bytes contents(const ByteArray& stream) {
  return Bytes(stream.begin(), stream.end());
}

// Elements from .. from + n - 1 of the array.
inline Bytes slice(const ByteArray& a, Long from, Long n) {
  Bytes out;
  for (Long i = from; i < from + n; ++i) out.push_back(a(i));
  return out;
}

// The first `n` bytes of `bytes`.
inline Bytes prefix(const Bytes& bytes, std::size_t n) {
  return Bytes(bytes.begin(), bytes.begin() + static_cast<std::ptrdiff_t>(n));
}

inline Bytes cat(std::initializer_list<Bytes> parts) {
  Bytes out;
  for (const Bytes& p : parts) out.insert(out.end(), p.begin(), p.end());
  return out;
}

// `count` copies of the two bytes of one UTF-16LE code unit.
inline Bytes units(Byte low, Byte high, int count) {
  Bytes out;
  for (int i = 0; i < count; ++i) {
    out.push_back(low);
    out.push_back(high);
  }
  return out;
}

// The bytes an object's StreamOut writes from Position 0, without the spare
// byte after them: a fingerprint of everything the object streams.
inline Bytes encoding(IKVStream& object) {
  ByteArray stream;
  Long position = 0;
  object.StreamOut(stream, position);
  return prefix(contents(stream), static_cast<std::size_t>(position));
}

}  // namespace kvdata::testing
