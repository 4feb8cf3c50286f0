#pragma once
// The body shared by the targets of the objects' StreamIn: decode a framed
// stream into an object in a known state, check what StreamIn did to the
// stream, Position and the object, and, when it succeeded, write the object
// out, read that into a fresh object and write it again: both encodings must
// be the same bytes.
//
//   return kvdata::fuzz::object_target(data, size, tolerance_ops());

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <vector>

#include "fuzz_support.hpp"

namespace kvdata::fuzz {

template <class Object>
struct ObjectStream {
  // A fresh object, and one in a known non-empty state whose encoding tells
  // whether a failed StreamIn changed it.
  std::function<std::shared_ptr<Object>()> fresh;
  std::function<std::shared_ptr<Object>()> known;
  // Extra checks after StreamIn, given the object, the result, the Position
  // at entry and at exit.
  std::function<void(const Object&, bool, Long, Long)> after_read;
  // StreamIn leaves the object as it was when it fails.
  bool whole_or_nothing = false;
  // StreamIn takes exactly the bytes StreamOut writes (Position after
  // StreamOut minus Position at entry) and StreamOut writes them back as they
  // were read.
  bool canonical = false;
};

// The object's encoding from Position 0 of a fresh stream, cut at the final
// Position (a writer may leave spare elements after it).
template <class Object>
std::vector<Byte> encode(Object& object) {
  ByteArray out = empty_stream();
  Long end = 0;
  KVDATA_FUZZ_CHECK(object.StreamOut(out, end), "StreamOut failed on an object");
  KVDATA_FUZZ_CHECK(end >= 0 && static_cast<std::size_t>(end) <= out.size(),
                    "StreamOut left Position outside the array");
  std::vector<Byte> bytes = bytes_of(out);
  bytes.resize(static_cast<std::size_t>(end));
  return bytes;
}

template <class Object>
int object_target(const std::uint8_t* data, std::size_t size, const ObjectStream<Object>& ops) {
  Framed in = frame(data, size);
  const Long start = in.position;
  const auto object = ops.known();
  // Only an object that promises to stay as it was needs its encoding now
  // (some known states, such as a tile set without tiles, cannot be written).
  const std::vector<Byte> before = ops.whole_or_nothing ? encode(*object) : std::vector<Byte>();

  const bool ok = object->StreamIn(in.stream, in.position);
  KVDATA_FUZZ_CHECK(in.unchanged(), "StreamIn changed the stream");
  const long long moved = static_cast<long long>(in.position) - start;
  KVDATA_FUZZ_CHECK(moved >= 0, "StreamIn moved Position backwards");
  KVDATA_FUZZ_CHECK(moved <= available(in.stream, start),
                    "StreamIn moved Position past the stream's end");
  if (ops.after_read) ops.after_read(*object, ok, start, in.position);

  if (!ok) {
    if (ops.whole_or_nothing) {
      KVDATA_FUZZ_CHECK(encode(*object) == before, "a failed StreamIn changed the object");
    }
    return 0;
  }

  const std::vector<Byte> first = encode(*object);
  if (ops.canonical) {
    KVDATA_FUZZ_CHECK(static_cast<long long>(first.size()) == moved,
                      "the encoding is not as long as the bytes read");
    const auto taken = static_cast<std::size_t>(static_cast<long long>(start) - in.stream.lbound());
    KVDATA_FUZZ_CHECK(
        first.empty() || std::memcmp(first.data(), in.stream.data() + taken, first.size()) == 0,
        "the object was written back to other bytes");
  }

  // StreamOut may leave spare elements after the encoding; the reader gets
  // the array as StreamOut left it.
  ByteArray out = empty_stream();
  Long end = 0;
  KVDATA_FUZZ_CHECK(object->StreamOut(out, end), "StreamOut failed on an object read");
  const auto again = ops.fresh();
  Long position = 0;
  KVDATA_FUZZ_CHECK(again->StreamIn(out, position), "the object's own encoding does not read back");
  KVDATA_FUZZ_CHECK(position == end, "reading the encoding back stopped elsewhere");
  KVDATA_FUZZ_CHECK(encode(*again) == first, "the object changed on its round trip");
  return 0;
}

}  // namespace kvdata::fuzz
