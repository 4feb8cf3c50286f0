#pragma once
// Shared pieces of the libFuzzer targets: a quiet, counting event log, the
// framing that turns a fuzz input into a byte stream with a lower bound and a
// Position, and the checks that end a run with a report when a decoder breaks
// its contract.
//
//   kvdata::fuzz::Framed in = kvdata::fuzz::frame(data, size);
//   KVDATA_FUZZ_CHECK(in.position_after_read_ok(end), "Position moved past the stream");

#include <unistd.h>

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <initializer_list>
#include <limits>
#include <span>
#include <string>
#include <vector>

#include "kvdata/kvdata.hpp"

namespace kvdata::fuzz {

// Ends the run with a message naming the broken expectation; libFuzzer keeps
// the input that did it.
[[noreturn]] inline void fail(const char* what, const char* file, int line) {
  std::fprintf(stderr, "\n*** fuzz check failed: %s (%s:%d)\n", what, file, line);
  std::fflush(stderr);
  std::abort();
}

#define KVDATA_FUZZ_CHECK(condition, what)                            \
  do {                                                                \
    if (!(condition)) ::kvdata::fuzz::fail(what, __FILE__, __LINE__); \
  } while (false)

// Event-log entries go to a counter instead of the system log: a decoder fed
// garbage logs on almost every run, and the system log would both slow the
// run down and fill up.
inline std::size_t& log_entries() {
  static std::size_t count = 0;
  return count;
}
inline void quiet_event_log() {
  EventLog::SetSink([](const String&) { ++log_entries(); });
}

// A fuzz input read front to back; reads past its end give zeros.
class Input {
 public:
  Input(const std::uint8_t* data, std::size_t size) : data_(data), size_(size) {}

  std::uint8_t byte() { return at_ < size_ ? data_[at_++] : 0; }
  std::uint32_t u32() {
    std::uint32_t v = 0;
    for (int i = 0; i < 4; ++i) v |= static_cast<std::uint32_t>(byte()) << (8 * i);
    return v;
  }
  // What is left, as a span.
  std::span<const std::uint8_t> rest() const {
    return at_ < size_ ? std::span(data_ + at_, size_ - at_) : std::span<const std::uint8_t>();
  }

 private:
  const std::uint8_t* data_;
  std::size_t size_;
  std::size_t at_ = 0;
};

// Elements from index `position` to the array's end (0 when outside it).
inline long long available(const ByteArray& stream, Long position) {
  if (!stream.has_bounds()) return 0;
  const long long lo = stream.lbound();
  const long long hi = stream.ubound();
  const long long p = position;
  return (p < lo || p > hi) ? 0 : hi - p + 1;
}

// A stream for a decoder: the array, the Position to read from, and the
// array's contents as given, to prove later that reading did not change it.
struct Framed {
  ByteArray stream;
  Long position = 0;
  std::vector<Byte> original;

  // Elements from `position` to the array's end (0 when outside it).
  long long available() const { return fuzz::available(stream, position); }
  bool unchanged() const {
    return stream.size() == original.size() &&
           (original.empty() || std::memcmp(stream.data(), original.data(), original.size()) == 0);
  }
};

// Frames a fuzz input. The first byte chooses the array's shape and the
// Position; the rest are the stream's elements:
//   bits 0-2  lower bound: 0-3 -> 0, 4 -> 1, 5 -> -7, 6 -> the lowest Long
//             (an empty stream then has no bounds at all), 7 -> the upper
//             bound is the highest Long (Positions near the Long's end)
//   bits 3-4  Position: 0-1 -> the lower bound, 2 -> lower bound + the next
//             byte, 3 -> the next four bytes as a Long (anywhere at all)
// Seeds written with a first byte 0 are plain streams read from index 0.
inline Framed frame(const std::uint8_t* data, std::size_t size) {
  Input in(data, size);
  const std::uint8_t shape = in.byte();
  const int bound_mode = shape & 0x07;
  const int position_mode = (shape >> 3) & 0x03;
  std::uint8_t delta = 0;
  std::uint32_t raw_position = 0;
  if (position_mode == 2) delta = in.byte();
  if (position_mode == 3) raw_position = in.u32();

  const auto body = in.rest();
  // Keep the upper bound representable: at most 2^30 elements are framed.
  const auto n = static_cast<Long>(body.size());
  constexpr Long kMin = std::numeric_limits<Long>::min();
  constexpr Long kMax = std::numeric_limits<Long>::max();

  Framed f;
  Long lower = 0;
  bool bounded = true;
  switch (bound_mode) {
    case 4:
      lower = 1;
      break;
    case 5:
      lower = -7;
      break;
    case 6:
      lower = kMin;
      bounded = n > 0;
      break;
    case 7:
      lower = n > 0 ? kMax - (n - 1) : kMax;
      break;
    default:
      lower = 0;
      break;
  }
  if (bounded) {
    f.stream.redim(lower, static_cast<Long>(static_cast<long long>(lower) + n - 1));
    if (n > 0) std::memcpy(f.stream.data(), body.data(), body.size());
  }
  f.original.assign(body.begin(), body.end());

  switch (position_mode) {
    case 2:
      f.position = static_cast<Long>(static_cast<long long>(lower) + delta > kMax
                                         ? kMax
                                         : static_cast<long long>(lower) + delta);
      break;
    case 3:
      f.position = static_cast<Long>(raw_position);
      break;
    default:
      f.position = lower;
      break;
  }
  return f;
}

// A fresh, empty stream from index 0 for the writing half of a round trip.
inline ByteArray empty_stream() {
  return ByteArray(0, -1);
}

// The elements of a stream, lower to upper bound.
inline std::vector<Byte> bytes_of(const ByteArray& stream) {
  return std::vector<Byte>(stream.begin(), stream.end());
}

// A stream from index 0 holding `bytes`.
inline ByteArray stream_of(const std::vector<Byte>& bytes) {
  ByteArray stream(0, static_cast<Long>(bytes.size()) - 1);
  if (!bytes.empty()) std::memcpy(stream.data(), bytes.data(), bytes.size());
  return stream;
}

// A private directory for targets that go through files, memory-backed when
// the system has /dev/shm (every run writes files), made on first use; the
// files named in `leaves` and the directory are removed when the run ends.
// Returns the directory's path.
inline const std::string& scratch_directory(const char* prefix,
                                            std::initializer_list<const char*> leaves) {
  static std::string dir;
  static std::vector<std::string> files;
  if (!dir.empty()) return dir;
  std::string shm = std::string("/dev/shm/") + prefix + "-XXXXXX";
  std::string tmp = std::string("/tmp/") + prefix + "-XXXXXX";
  const char* made = ::mkdtemp(shm.data());
  if (made == nullptr) made = ::mkdtemp(tmp.data());
  if (made == nullptr) std::abort();
  dir = made;
  for (const char* leaf : leaves) files.push_back(dir + "/" + leaf);
  std::atexit([] {
    for (const std::string& file : files) std::remove(file.c_str());
    ::rmdir(dir.c_str());
  });
  return dir;
}

}  // namespace kvdata::fuzz
