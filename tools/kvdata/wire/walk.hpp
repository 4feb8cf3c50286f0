#pragma once
// The result of walking a stream's layout field by field: every field read
// with its offset, width and decoded value, and the first place where the
// stream cannot be what its kind says, with what was expected there.
//
//   Walk w = walk_layout(StreamKind::User, bytes);
//   if (w.problem) std::cerr << w.problem->field << ": " << w.problem->expected;

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "wire/stream_kind.hpp"

namespace kvdata::cli {

struct FieldRow {
  std::size_t offset = 0;
  std::size_t width = 0;
  std::string name;   // path in the JSON form, "TS.Tiles(3).TempComp(12)"
  std::string value;  // decoded value as text
};

struct Problem {
  std::size_t offset = 0;
  std::string field;     // the field that cannot be read or does not fit
  std::string expected;  // what was expected there, in plain words
};

// How strongly a walk that fits says the bytes are of its kind.
enum class Evidence {
  Length = 0,        // a fixed-size block: any bytes of that length fit
  Structure = 1,     // counts and texts fill the bytes exactly
  Stamp = 2,         // a version stamp matched
  StampAndName = 3,  // a version stamp and a record name matched
};

struct Walk {
  StreamKind kind{};
  std::vector<FieldRow> rows;
  std::optional<Problem> problem;
  std::size_t end = 0;  // offset just past the last field read
  Evidence evidence = Evidence::Length;
  std::string evidence_text;  // "the version stamp 1.2 at offset 0"
};

}  // namespace kvdata::cli
