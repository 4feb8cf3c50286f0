#include "wire/library_readers.hpp"

#include "kvdata/automation/text.hpp"
#include "kvdata/objects/kv_calibration.hpp"
#include "kvdata/objects/kv_profile.hpp"
#include "kvdata/objects/kv_test_run.hpp"
#include "kvdata/objects/kv_tile.hpp"
#include "kvdata/objects/kv_tile_set.hpp"
#include "kvdata/objects/kv_tol_set.hpp"
#include "kvdata/objects/kv_tolerance.hpp"
#include "kvdata/objects/kv_user.hpp"
#include "kvdata/streams/streams.hpp"

namespace kvdata::cli {
namespace {

template <class Class>
void object_in(LibraryRead& r, const ByteArray& bytes) {
  auto object = Class::create();
  r.accepted = object->StreamIn(bytes, r.end);
  if constexpr (std::is_same_v<Class, KVUser>) {
    if (!r.accepted) r.message = to_utf8(object->ErrMsg());
  }
  r.object = object;
}

}  // namespace

LibraryRead read_with_library(StreamKind kind, const ByteArray& bytes) {
  LibraryRead r;
  r.end = bytes.has_bounds() ? bytes.lbound() : 0;
  // The Stream_ operations take the array by plain reference for both
  // directions; reading leaves it untouched.
  auto& stream = const_cast<ByteArray&>(bytes);
  Streams& streams = Streams::instance();
  constexpr auto from = eStreamDirection::FromStream;
  switch (kind) {
    case StreamKind::User:
      object_in<KVUser>(r, bytes);
      break;
    case StreamKind::Tolerance:
      object_in<KVTolerance>(r, bytes);
      break;
    case StreamKind::TolSet:
      object_in<KVTolSet>(r, bytes);
      break;
    case StreamKind::Tile:
      object_in<KVTile>(r, bytes);
      break;
    case StreamKind::TileSet:
      object_in<KVTileSet>(r, bytes);
      break;
    case StreamKind::Calibration:
      object_in<KVCalibration>(r, bytes);
      break;
    case StreamKind::Profile:
      object_in<KVProfile>(r, bytes);
      break;
    case StreamKind::TestRun:
      object_in<KVTestRun>(r, bytes);
      break;
    case StreamKind::SCPair:
      r.accepted = streams.Stream_SCPair(from, stream, r.end, r.scp);
      break;
    case StreamKind::TileSetCalibration:
      r.accepted = streams.Stream_TileSetCalibration(from, stream, r.end, r.ts, r.tsc);
      break;
    case StreamKind::ProfileRecord:
      r.accepted = streams.Stream_Profile(from, stream, r.end, r.pro);
      break;
    case StreamKind::Station:
      r.accepted = streams.Stream_Station(from, stream, r.end, r.station);
      break;
    case StreamKind::TestRunRecord:
      r.accepted = streams.Stream_TestRun(from, stream, r.end, r.tr);
      break;
    case StreamKind::UserBlock:
      r.accepted = streams.Stream_User(from, stream, r.end, r.user);
      break;
    case StreamKind::Organization:
      r.accepted = streams.Stream_Organization(from, stream, r.end, r.org);
      break;
  }
  return r;
}

}  // namespace kvdata::cli
