#pragma once
// Streams to JSON and back through the library's own readers and writers:
// the Streams record streams for the record kinds, and each object's
// StreamIn / StreamOut for the object kinds. The JSON document names its
// kind and holds the record (under the argument name of its record stream:
// "SCP", "TS" and "TSC", "pro", "Station", "TR", "User", "Org") or the
// object's properties ("v1User", "v1Tile", "v1TileSet", "v1Calibration",
// "v1TestRun" and "LightLevelData", or the tolerance, tolerance set and
// profile properties by name).
//
//   Json doc = decode_stream(StreamKind::Station, bytes);
//   std::vector<Byte> again = encode_stream(StreamKind::Station, doc);

#include <optional>
#include <span>
#include <string>
#include <vector>

#include "json/json.hpp"
#include "kvdata/automation/array.hpp"
#include "wire/stream_kind.hpp"

namespace kvdata::cli {

// Reads the stream from its first byte. When the library's reader refuses
// it, InputError says so (with the object's message or the library's log).
Json decode_stream(StreamKind kind, std::span<const Byte> bytes);

// Writes the document's record or object. Object streams come out as the
// whole array the object's StreamOut leaves (spare byte included), record
// streams as the bytes written. InputError names the field of a document
// that does not fit the record, or says why the library's writer refused.
std::vector<Byte> encode_stream(StreamKind kind, const Json& doc);

// The document's "kind" member, checked against `kind` when one is given.
StreamKind document_kind(const Json& doc, std::optional<StreamKind> kind);

namespace codec {

// The stream as a library byte array with indices 0..n-1.
ByteArray to_array(std::span<const Byte> bytes);
// Elements `from`..`to`-1 of a library byte array, by its own indices.
std::vector<Byte> from_array(const ByteArray& a, Long from, Long to);
// The whole array, lower to upper bound.
std::vector<Byte> whole_array(const ByteArray& a);

// A text for a fixed-width field of `units` UTF-16 code units: a longer text
// would be cut by the library, so it is refused here, naming `path`.
void check_width(const String& text, std::size_t units, const std::string& path);

// Per group of kinds; each returns false when it does not handle `kind`.
bool decode_record_stream(StreamKind kind, const ByteArray& a, Json& doc);
bool encode_record_stream(StreamKind kind, const Json& doc, std::vector<Byte>& out);
bool decode_user_objects(StreamKind kind, const ByteArray& a, Json& doc);
bool encode_user_objects(StreamKind kind, const Json& doc, std::vector<Byte>& out);
bool decode_tile_objects(StreamKind kind, const ByteArray& a, Json& doc);
bool encode_tile_objects(StreamKind kind, const Json& doc, std::vector<Byte>& out);
bool decode_profile_objects(StreamKind kind, const ByteArray& a, Json& doc);
bool encode_profile_objects(StreamKind kind, const Json& doc, std::vector<Byte>& out);

}  // namespace codec
}  // namespace kvdata::cli
