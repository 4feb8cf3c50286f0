#pragma once
// Field-by-field walks of every stream layout, independent of the library's
// readers: they show where each field sits and stop at the first field that
// cannot be read or does not fit, saying what was expected there. Object
// streams may end with the one spare byte that their writers leave after the
// encoding; more bytes after a stream are a problem.
//
//   Walk w = walk_layout(StreamKind::TolSet, bytes);
//   for (const FieldRow& r : w.rows) ...

#include <span>

#include "kvdata/automation/types.hpp"
#include "wire/walk.hpp"

namespace kvdata::cli {

Walk walk_layout(StreamKind kind, std::span<const Byte> bytes);

}  // namespace kvdata::cli
