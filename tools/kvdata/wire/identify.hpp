#pragma once
// Tells which kind of stream a file holds from what can be checked without
// being told: version stamps, the profile's record name, counts that fill
// the bytes exactly, and exact lengths. Each kind's layout walk is tried; a
// kind fits when its walk reads the whole stream without a problem.
//
//   Identification id = identify(bytes);
//   if (id.kind) std::cerr << id.reason;  else std::cerr << id.reason;  // asks for KIND

#include <optional>
#include <span>
#include <string>

#include "kvdata/automation/types.hpp"
#include "wire/stream_kind.hpp"

namespace kvdata::cli {

struct Identification {
  std::optional<StreamKind> kind;  // set when exactly one kind is the best fit
  std::string reason;              // what was concluded and why, or why no kind can be told
};

Identification identify(std::span<const Byte> bytes);

}  // namespace kvdata::cli
