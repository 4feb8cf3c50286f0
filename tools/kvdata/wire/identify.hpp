#pragma once
// Tells which kind of stream a file holds from what can be checked without
// being told: version stamps, the profile's record name, counts that fill
// the bytes exactly, and exact lengths. The library's reader of each kind
// is tried (stream_walk.hpp); a kind fits when its reader takes the whole
// stream and the end-of-stream rules hold.
//
//   Identification id = identify(bytes);
//   if (id.kind) std::cerr << id.reason;  else std::cerr << id.reason;  // asks for KIND

#include <optional>
#include <string>

#include "kvdata/automation/array.hpp"
#include "wire/stream_kind.hpp"

namespace kvdata::cli {

struct Identification {
  std::optional<StreamKind> kind;  // set when exactly one kind is the best fit
  std::string reason;              // what was concluded and why, or why no kind can be told
};

Identification identify(const ByteArray& bytes);

}  // namespace kvdata::cli
