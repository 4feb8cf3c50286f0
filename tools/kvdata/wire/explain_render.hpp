#pragma once
// Output of `kvdata explain`, written while the library's reader walks the
// stream: each field becomes a row (offset, width, raw bytes, path, value)
// of an aligned table or an entry of a JSON array as it is reported, and
// nothing is kept per field. The table's columns are fixed before the first
// row: the stream's size bounds the offset, width and bytes columns, and a
// first walk that keeps only the longest path sizes the field column.
//
//   OutputFile out(path);
//   const WalkEnd end = explain_table(StreamKind::User, bytes, size, out);
//   out.commit();

#include <cstddef>
#include <span>
#include <string>

#include "kvdata/automation/array.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "support/files.hpp"
#include "wire/stream_walk.hpp"

namespace kvdata::cli {

// Raw bytes in hex, at most `limit` of them, then "+N" for the rest.
std::string hex_bytes(std::span<const Byte> bytes, std::size_t limit = 8);

// The value of a field as explain shows it; `stream` holds the bytes the
// field's position counts into (for a Boolean's raw byte).
std::string value_text(const StreamField& f, std::span<const Byte> stream);

// A heading, the table of fields, the row where the walk stops (if it does)
// and the verdict. `size`: the stream's whole size, when `bytes` holds only
// its start (as for walk_stream).
WalkEnd explain_table(StreamKind kind, const ByteArray& bytes, std::size_t size, OutputFile& out);

// {"kind", "size", "fields": [{"offset", "width", "bytes", "field", "value"}, ...], "problem"}.
WalkEnd explain_json(StreamKind kind, const ByteArray& bytes, std::size_t size, OutputFile& out);

}  // namespace kvdata::cli
