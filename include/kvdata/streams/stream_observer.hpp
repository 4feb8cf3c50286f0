#pragma once
// Watching the library's own readers and writers at work. While an observer
// is installed on a thread, every stream reader called on that thread (the
// Streams record streams and each object's StreamIn) reports each field it
// takes: where it starts, how many bytes it spans and the value read; the
// nesting of records and array elements around it; and, when it gives up,
// where and what it expected there. Writers report the fixed-width texts
// they write, with the whole text they were given, so that a caller can
// refuse a text the field would cut: the record and block writers at the
// stream index where the text goes, and the properties that keep their
// record as a byte image (a tolerance's TolName, a tile's v1Tile, a
// calibration's v1Calibration) when the text is set, at its offset in the
// record. A program that shows a stream field by
// field (or checks a document before writing it) thereby sees exactly what
// the library does, with no second decoder that could disagree with it.
//
//   struct Printer : kvdata::StreamObserver {
//     void field(const kvdata::StreamField& f) override { ... f.name, f.position, f.width ... }
//   } printer;
//   kvdata::ObservedStreams watch(printer);
//   user->StreamIn(bytes, pos);     // printer sees "stream version", then v1User's fields
//
// Names are those of the records and properties (record_fields.hpp,
// object_fields.hpp); a name of bytes that hold no field says what they are
// (stream_names below). The record streams enter their records under the
// names of their arguments (SCP, TS and TSC, pro, Station, TR, User, Org);
// the objects enter their properties (v1User, v1Tile, v1TileSet,
// v1Calibration, v1TestRun, Tolerances(i)) and report a record stream they
// read under those names. A field's full path is the names of the records
// entered around it joined with dots, an element index in parentheses:
// "TS.Tiles(3).TempComp(12)", the same path as the kvdata command's JSON.
//
// The observer is called synchronously on the reading thread and must not
// throw: the library's operations report failure by their result, so an
// exception from an observer would only become a failure of theirs. Installing
// one affects that thread only. With no observer installed, a reader looks
// the thread-local pointer up once per record and tests it once per field.

#include <cstddef>
#include <optional>
#include <string_view>
#include <variant>

#include "kvdata/automation/types.hpp"

namespace kvdata {

// The value of one field. monostate: bytes that carry no value (a gap,
// padding, a spare byte).
using FieldValue = std::variant<std::monostate, Byte, Integer, Long, Single, Double, Date, bool,
                                std::u16string_view>;

struct StreamField {
  std::string_view name;
  std::optional<Long> index;  // element of a fixed array: "TempComp" band 12
  Long position = 0;          // index of the field's first byte in the array
  Long width = 0;             // bytes
  FieldValue value;
  // Fixed-width text: the field's width in UTF-16 code units (0 for every
  // other field). On writing, `value` is the text given, which the field
  // cuts when it is longer. (The user block carries only the low byte of
  // RoleCode's one unit: width 1, units 1.)
  std::size_t units = 0;
};

class StreamObserver {
 public:
  virtual ~StreamObserver() = default;
  // A nested record, or element `index` of an array of records, begins.
  virtual void enter(std::string_view /*name*/, std::optional<Long> /*index*/) {}
  // The record entered last ends.
  virtual void leave() {}
  // A field was read, or a fixed-width text is about to be written.
  virtual void field(const StreamField& /*f*/) {}
  // The reader stops at `position`, at the field `name` (element `index` of
  // it, for a fixed array; a field of the record entered last, or a
  // description such as "tile count"), having expected what `expected` says
  // in plain words ("a tile count from 1 to 254; found 300"). A reader
  // refuses at most once, and reads nothing after it.
  virtual void refused(Long /*position*/, std::string_view /*name*/, std::optional<Long> /*index*/,
                       std::string_view /*expected*/) {}
};

// Installs `observer` for the readers and writers called on this thread
// while the object lives; the one installed before comes back afterwards.
class ObservedStreams {
 public:
  explicit ObservedStreams(StreamObserver& observer) noexcept;
  ~ObservedStreams();
  ObservedStreams(const ObservedStreams&) = delete;
  ObservedStreams& operator=(const ObservedStreams&) = delete;

 private:
  StreamObserver* previous_;
};

// The observer installed on this thread, or nullptr.
StreamObserver* stream_observer() noexcept;

// Names of the bytes that hold no field of a record, as readers report them
// (and as a program that shows a stream names what follows the encoding).
namespace stream_names {
inline constexpr std::string_view kStreamVersion = "stream version";  // a stamp a reader checks
inline constexpr std::string_view kAlignmentGap = "alignment gap";    // written as 0, not read
inline constexpr std::string_view kTrailingByte = "trailing byte";    // written as 0, dropped
inline constexpr std::string_view kZeroBytes = "zero bytes";          // written as 0, not read
inline constexpr std::string_view kTileCount = "tile count";
inline constexpr std::string_view kMemberCount = "member count";
inline constexpr std::string_view kRecordName = "record name";  // the type name of a Variant record
// After the encoding: the byte an object's writer leaves, and anything more.
inline constexpr std::string_view kSpareByte = "spare byte";
inline constexpr std::string_view kEndOfStream = "end of stream";
}  // namespace stream_names

}  // namespace kvdata
