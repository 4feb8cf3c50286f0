#pragma once
// A stream field by field, as the library's own reader takes it: the
// reader for the kind runs with an observer that hands every field to a
// sink under its full path (the path of the command's JSON documents), and
// the first place where the stream cannot be what its kind says comes back
// with what was expected there. After a reader that accepted the stream,
// the end-of-stream rules apply: an object stream may end with the one
// spare byte its writer leaves (handed to the sink as "spare byte"); any
// more bytes are a problem. Nothing is kept per field, so a walk of any
// stream needs no more memory than the reader itself.
//
//   struct Print : WalkSink { void field(std::string_view path, const StreamField& f) override; };
//   const WalkEnd end = walk_stream(StreamKind::User, bytes, print);
//   if (end.problem) ... end.problem->offset, end.problem->field, end.problem->expected

#include <cstddef>
#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "kvdata/automation/array.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "wire/stream_kind.hpp"

namespace kvdata::cli {

class WalkSink {
 public:
  virtual ~WalkSink() = default;
  // A field read, in stream order; `path` is valid during the call.
  virtual void field(std::string_view path, const StreamField& f) = 0;
};

struct Problem {
  std::size_t offset = 0;
  std::string field;     // the path of the field that cannot be read or does not fit
  std::string expected;  // what was expected there, in plain words
};

struct WalkEnd {
  std::optional<Problem> problem;
  std::size_t end = 0;  // offset just past the last field
};

// Offsets count from the array's lower bound. An error the sink raises
// stops the walk and is raised again once the reader has returned. When
// there is a problem the library's log entries are kept (library_log.hpp).
// `size`: the whole stream's size when `bytes` holds only its start (the
// bytes of a fixed-size kind, read from a longer file); the bytes beyond
// count as bytes that follow the stream.
WalkEnd walk_stream(StreamKind kind, const ByteArray& bytes, WalkSink& sink,
                    std::optional<std::size_t> size = std::nullopt);

// One line: "The whole stream reads as KIND (N bytes)." or where it stops and why.
std::string verdict(StreamKind kind, const WalkEnd& end, std::size_t size);

// For messages about a stream: the field that holds byte `offset`,
// "TS.Tiles(2).Name (offset 170, 9 bytes)", or "" outside every field.
std::string field_at(StreamKind kind, std::span<const Byte> bytes, std::size_t offset);
// A walk that only looks for the problem.
WalkEnd walk_stream(StreamKind kind, const ByteArray& bytes,
                    std::optional<std::size_t> size = std::nullopt);

}  // namespace kvdata::cli
