#pragma once
// The body shared by the record-stream targets: read a record from a framed
// stream, check what the reader did to Position, the stream and the record,
// and, when it succeeded, write the record out, read it again and write it
// once more: both encodings must be the same bytes.
//
//   return kvdata::fuzz::record_target<kvdata::tStation>(data, size, station_stream());

#include <cstddef>
#include <cstdint>
#include <functional>

#include "fuzz_support.hpp"

namespace kvdata::fuzz {

template <class Record>
struct RecordStream {
  // Reads or writes one record through the Streams operation under test.
  std::function<bool(ByteArray&, Long&, Record&)> read;
  std::function<bool(ByteArray&, Long&, Record&)> write;
  // A fixed block that the writer does not grow the stream for (0: the
  // writer grows it value by value).
  std::size_t block_bytes = 0;
  // The reader replaces the record only when all of it was read.
  bool whole_or_nothing = false;
  // Every stream the reader accepts is written back byte for byte (no
  // Boolean bytes, counts or padding that reading normalises).
  bool canonical = false;
};

// The encoding of `record` in a fresh stream from index 0, and whether the
// writer succeeded.
template <class Record>
bool encode(const RecordStream<Record>& ops, Record record, std::vector<Byte>& bytes) {
  ByteArray out =
      ops.block_bytes > 0 ? ByteArray(0, static_cast<Long>(ops.block_bytes) - 1) : empty_stream();
  Long end = 0;
  const bool ok = ops.write(out, end, record);
  bytes = bytes_of(out);
  return ok && end == static_cast<Long>(bytes.size());
}

template <class Record>
int record_target(const std::uint8_t* data, std::size_t size, const RecordStream<Record>& ops,
                  const Record& initial = Record{}) {
  Framed in = frame(data, size);
  const Long start = in.position;
  Record record = initial;
  const bool ok = ops.read(in.stream, in.position, record);

  KVDATA_FUZZ_CHECK(in.unchanged(), "the reader changed the stream");
  const long long moved = static_cast<long long>(in.position) - start;
  KVDATA_FUZZ_CHECK(moved >= 0, "the reader moved Position backwards");
  // A reader never moves past bytes it did not have.
  KVDATA_FUZZ_CHECK(moved <= available(in.stream, start),
                    "the reader moved Position past the stream's end");

  if (!ok) {
    if (ops.whole_or_nothing) {
      KVDATA_FUZZ_CHECK(record == initial, "a failed read changed the record");
    }
    return 0;
  }

  std::vector<Byte> first;
  KVDATA_FUZZ_CHECK(encode(ops, record, first), "a record that was read cannot be written");
  KVDATA_FUZZ_CHECK(static_cast<long long>(first.size()) == moved,
                    "the record's encoding is not as long as the bytes read");
  if (ops.canonical) {
    const auto taken = static_cast<std::size_t>(static_cast<long long>(start) - in.stream.lbound());
    KVDATA_FUZZ_CHECK(
        first.empty() || std::memcmp(first.data(), in.stream.data() + taken, first.size()) == 0,
        "the record was written back to other bytes");
  }

  ByteArray again_stream = stream_of(first);
  Long again_position = 0;
  Record again = initial;
  KVDATA_FUZZ_CHECK(ops.read(again_stream, again_position, again),
                    "the record's own encoding does not read back");
  KVDATA_FUZZ_CHECK(again_position == static_cast<Long>(first.size()),
                    "reading the encoding back stopped elsewhere");
  std::vector<Byte> second;
  KVDATA_FUZZ_CHECK(encode(ops, again, second), "the record read back cannot be written");
  KVDATA_FUZZ_CHECK(first == second, "the record changed on its round trip");
  return 0;
}

}  // namespace kvdata::fuzz
