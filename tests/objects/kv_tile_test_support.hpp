#pragma once
// Small helpers shared by the tile, tile-set and calibration tests: byte
// arrays with a chosen lower bound, slices of them, and an event-log sink
// that keeps codec entries out of the system log.

#include <gtest/gtest.h>

#include <initializer_list>
#include <vector>

#include "kvdata/kvdata.hpp"
#include "support/error_number.hpp"

namespace kvdata::testing {

using Bytes = std::vector<Byte>;

// An array with bounds lower .. lower + size - 1 holding `bytes`.
inline ByteArray array_at(Long lower, const Bytes& bytes) {
  ByteArray out(lower, lower + static_cast<Long>(bytes.size()) - 1);
  Long i = lower;
  for (const Byte b : bytes) out(i++) = b;
  return out;
}

// Elements from .. from + n - 1 of the array.
inline Bytes slice(const ByteArray& a, Long from, Long n) {
  Bytes out;
  for (Long i = from; i < from + n; ++i) out.push_back(a(i));
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

inline Bytes cat(std::initializer_list<Bytes> parts) {
  Bytes out;
  for (const Bytes& p : parts) out.insert(out.end(), p.begin(), p.end());
  return out;
}

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

}  // namespace kvdata::testing
