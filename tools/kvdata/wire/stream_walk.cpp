#include "wire/stream_walk.hpp"

#include <algorithm>
#include <exception>
#include <vector>

#include "support/library_log.hpp"
#include "wire/codec.hpp"
#include "wire/field_path.hpp"

namespace kvdata::cli {
namespace {

// Turns what the reader reports into paths for the sink, and keeps the
// first refusal. After an error in the sink it only waits for the reader
// to return.
class Walker : public StreamObserver {
 public:
  Walker(const ByteArray& bytes, WalkSink& sink)
      : lower_(bytes.has_bounds() ? bytes.lbound() : 0), sink_(sink) {}

  void enter(std::string_view name, std::optional<Long> index) override {
    path_.enter(name, index);
  }
  void leave() override { path_.leave(); }

  void field(const StreamField& f) override {
    if (failure_) return;
    try {
      StreamField at = f;
      at.position = f.position - lower_;
      sink_.field(path_.of(f.name, f.index), at);
      end_ = std::max(end_, static_cast<std::size_t>(at.position + at.width));
    } catch (...) {
      failure_ = std::current_exception();
    }
  }

  void refused(Long position, std::string_view name, std::optional<Long> index,
               std::string_view expected) override {
    if (problem_ || failure_) return;
    problem_ = Problem{static_cast<std::size_t>(std::max<Long>(position - lower_, 0)),
                       std::string(path_.of(name, index)), std::string(expected)};
  }

  void rethrow() const {
    if (failure_) std::rethrow_exception(failure_);
  }

  Long lower_;
  WalkSink& sink_;
  FieldPath path_;
  std::optional<Problem> problem_;
  std::size_t end_ = 0;
  std::exception_ptr failure_;
};

// The end-of-stream rules after a reader that accepted the stream.
void finish(StreamKind kind, std::size_t size, std::size_t end, Walker& walker) {
  if (end >= size) return;
  std::size_t left = size - end;
  if (info(kind).object) {
    walker.field(StreamField{stream_names::kSpareByte, std::nullopt,
                             static_cast<Long>(end) + walker.lower_, 1, std::monostate{}, 0});
    ++end;
    --left;
  }
  if (left > 0) {
    walker.problem_ =
        Problem{end, std::string(stream_names::kEndOfStream),
                "the end of the " + std::string(kind_name(kind)) + " stream; " +
                    std::to_string(left) + " more bytes follow that belong to no field"};
  }
}

}  // namespace

WalkEnd walk_stream(StreamKind kind, const ByteArray& bytes, WalkSink& sink,
                    std::optional<std::size_t> size) {
  Walker walker(bytes, sink);
  bool accepted = false;
  Long end = 0;
  std::string message;
  // The reader's event-log entries stay with the run when the walk finds
  // a problem (they are shown under the command's message with -v).
  LibraryLog log;
  {
    const ObservedStreams watch(walker);
    // The Stream_ operations take the array by plain reference for both
    // directions; reading leaves it untouched.
    accepted = stream_state(kind)->read_library(const_cast<ByteArray&>(bytes), end, message);
  }
  walker.rethrow();
  const auto stopped = static_cast<std::size_t>(std::max<Long>(end - walker.lower_, 0));
  if (accepted) {
    finish(kind, size.value_or(bytes.has_bounds() ? bytes.size() : 0), stopped, walker);
    walker.rethrow();
  } else if (!walker.problem_) {
    // A refusal the reader did not explain (it ran out of memory, say).
    walker.problem_ = Problem{walker.end_, std::string(kind_name(kind)),
                              "what the library's reader could take; it refused the stream here" +
                                  (message.empty() ? std::string() : ": " + message)};
  }
  if (walker.problem_) log.keep();
  return WalkEnd{std::move(walker.problem_), walker.end_};
}

std::string verdict(StreamKind kind, const WalkEnd& end, std::size_t size) {
  if (!end.problem) {
    return "The whole stream reads as " + std::string(kind_name(kind)) + " (" +
           std::to_string(size) + " bytes).";
  }
  return "Stops at offset " + std::to_string(end.problem->offset) + ", " + end.problem->field +
         ": expected " + end.problem->expected + ".";
}

namespace {

ByteArray array_of(std::span<const Byte> bytes) {
  ByteArray a(0, static_cast<Long>(bytes.size()) - 1);
  std::copy(bytes.begin(), bytes.end(), a.begin());
  return a;
}

class FindOffset : public WalkSink {
 public:
  explicit FindOffset(std::size_t offset) : offset_(offset) {}
  void field(std::string_view path, const StreamField& f) override {
    const auto at = static_cast<std::size_t>(f.position);
    if (found_.empty() && offset_ >= at && offset_ < at + static_cast<std::size_t>(f.width)) {
      found_ = std::string(path) + " (offset " + std::to_string(at) + ", " +
               std::to_string(f.width) + (f.width == 1 ? " byte)" : " bytes)");
    }
  }
  std::size_t offset_;
  std::string found_;
};

class Ignore : public WalkSink {
 public:
  void field(std::string_view, const StreamField&) override {}
};

}  // namespace

std::string field_at(StreamKind kind, std::span<const Byte> bytes, std::size_t offset) {
  FindOffset find(offset);
  LibraryLog drop;  // a second look at the stream
  static_cast<void>(walk_stream(kind, array_of(bytes), find));
  return find.found_;
}

WalkEnd walk_stream(StreamKind kind, const ByteArray& bytes, std::optional<std::size_t> size) {
  Ignore ignore;
  return walk_stream(kind, bytes, ignore, size);
}

}  // namespace kvdata::cli
