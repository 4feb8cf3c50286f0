#pragma once
// The library's own reader for each kind of stream, run on a byte array from
// its first index into scratch objects: the Streams record streams for the
// record kinds, a new object's StreamIn for the object kinds. Whatever
// observer is installed on the thread watches the reader at work.
//
//   const LibraryRead r = read_with_library(StreamKind::Station, bytes);
//   if (r.accepted) use(r.station);   // r.end: the Position after the record

#include <memory>
#include <string>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/foundation/records.hpp"
#include "wire/stream_kind.hpp"

namespace kvdata::cli {

struct LibraryRead {
  bool accepted = false;  // the reader's own answer
  Long end = 0;           // the Position the reader left
  std::string message;    // the object's ErrMsg, for an object that keeps one
  // Object kinds: the object that read the stream (KVUser, KVTolerance, ...).
  std::shared_ptr<Object> object;
  // Record kinds: the records the Stream_ operation read into, named after its arguments.
  tSCPair scp;
  tTileSet ts;
  tTileSetCalibration tsc;
  tOVProfile pro;
  tStation station;
  tTestRun1 tr;
  tUser user;
  tOrganization org;
};

// Reads from the array's lower bound. Errors the reader lets out (none of
// them is documented to) pass through.
LibraryRead read_with_library(StreamKind kind, const ByteArray& bytes);

}  // namespace kvdata::cli
