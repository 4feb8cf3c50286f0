#pragma once
// Pieces shared by the codec groups (internal to wire/).
//
//   auto r = document_member<tStation>(doc, "Station");
//   std::vector<Byte> bytes = object_out(*tile, "tile");

#include <string>
#include <vector>

#include "json/fields.hpp"
#include "json/json.hpp"
#include "json/records.hpp"
#include "kvdata/foundation/ikv_stream.hpp"

namespace kvdata::cli::codec {

// StreamIn from the array's first byte; a False result raises InputError
// naming the library's `what` reader, with `message` (the object's ErrMsg)
// and the library's log when there are any.
void object_in(IKVStream& object, const ByteArray& a, const char* what,
               const std::string& message = {});

// StreamOut into a new array from Position 0; the whole array comes back,
// the spare byte the object leaves after its encoding included.
std::vector<Byte> object_out(IKVStream& object, const char* what);

// The document's one member besides "kind", read into a record.
template <class R>
R document_member(const Json& doc, const char* name) {
  Fields f(doc, "");
  f.get("kind");
  R r;
  read_record(f.get(name), name, r);
  f.done();
  return r;
}

}  // namespace kvdata::cli::codec
