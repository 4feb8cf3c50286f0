#pragma once
// Streams to JSON and back through the library's own readers and writers:
// the Streams record streams for the record kinds, and each object's
// StreamIn / StreamOut for the object kinds. A document names its kind and
// holds the records under the argument names of their record stream ("SCP",
// "TS" and "TSC", "pro", "Station", "TR", "User", "Org") or the object's
// properties by name ("v1User", "ID", "Tolerances", "StreamVersion", ...),
// in the form of json/records.hpp. Nothing here lists a record's fields: the
// library's descriptions of the records and objects are walked.
//
//   auto state = decode_stream(StreamKind::Station, bytes);
//   write_document(*state, writer);                   // {"kind": "station", "Station": {...}}
//   ByteArray again = read_document(doc, std::nullopt)->write_stream();

#include <functional>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "json/fields.hpp"
#include "json/json.hpp"
#include "json/json_writer.hpp"
#include "kvdata/automation/array.hpp"
#include "kvdata/foundation/records.hpp"
#include "wire/stream_kind.hpp"

namespace kvdata::cli {

// A spectrum, or a pair of spectra indexed by an enumeration, found in a
// stream's records, for drawing.
struct SpectrumSeries {
  std::string path;  // as in the document: "TSC.Tiles(3)", "WhiteCorrection"
  // The enumeration's member name of each spectrum ("SCE", "SCI"), or ""
  // for a spectrum on its own.
  std::vector<std::pair<std::string_view, const tSpectrum*>> lines;
  // The first text and the first Long of the record that holds the spectrum
  // beside it (a tile's name and display colour), when it has them.
  const String* name = nullptr;
  const Long* colour = nullptr;
};
using SpectrumVisitor = std::function<void(const SpectrumSeries&)>;

// The records or object values of one stream, on their way between its
// bytes and its JSON document.
class StreamState {
 public:
  virtual ~StreamState() = default;
  StreamKind kind() const { return kind_; }
  // The size of every stream of a fixed-size kind, the spare byte of an
  // object stream included: its reader takes no more. None for the others.
  virtual std::optional<std::size_t> fixed_bytes() const = 0;

  // The library's reader alone, from the array's first element, as
  // whatever observer is installed watches it: whether it took the stream,
  // the Position it left in `end`, and the object's own message when it
  // refused. Errors the reader lets out (none is documented to) pass through.
  virtual bool read_library(ByteArray& bytes, Long& end, std::string& message) = 0;
  // Reads the stream with the library's reader from the array's first
  // element and keeps what it read. InputError when the reader refuses it,
  // with the library's message and log.
  virtual void read_stream(ByteArray& bytes) = 0;
  // Reads the document's members (other than "kind") from `f`; InputError
  // names the field of a member that is missing, unknown or malformed.
  virtual void read_members(Fields& f) = 0;
  // Writes the document's members (other than "kind").
  virtual void write_members(JsonWriter& w) const = 0;
  // Writes the stream with the library's writer while a WidthCheck refuses
  // texts longer than their fields: object streams as the whole array the
  // object's StreamOut leaves (spare byte included), record streams as the
  // bytes written. `room`: bytes to reserve up front (the expected size).
  // The values move into the library's objects: the state is spent.
  virtual ByteArray write_stream(std::size_t room = 0) = 0;
  // Calls `visit` for every spectrum or pair of spectra, in document order.
  virtual void find_spectra(const SpectrumVisitor& visit) const = 0;

 protected:
  explicit StreamState(StreamKind kind) : kind_(kind) {}

 private:
  StreamKind kind_;
};

// A state of the kind, not yet read or filled.
std::unique_ptr<StreamState> stream_state(StreamKind kind);

// Reads the stream from its first element. InputError when the library's
// reader refuses it.
std::unique_ptr<StreamState> decode_stream(StreamKind kind, ByteArray& bytes);

// {"kind": ..., members}, as nlohmann's dump(2) would print it.
void write_document(const StreamState& state, JsonWriter& w);
// The same document as text (for tests and fuzzing).
std::string document_text(const StreamState& state);

// The document's "kind" member, checked against `kind` when one is given.
StreamKind document_kind(const Json& doc, std::optional<StreamKind> kind);

// The state a document describes. InputError names the field that does not
// fit the record or object.
std::unique_ptr<StreamState> read_document(const Json& doc, std::optional<StreamKind> kind);

// The bytes of a stream as a span (none for an array without bounds).
std::span<const Byte> bytes_of(const ByteArray& a);

// read_document then write_stream, as bytes.
std::vector<Byte> encode_stream(StreamKind kind, const Json& doc);

}  // namespace kvdata::cli
