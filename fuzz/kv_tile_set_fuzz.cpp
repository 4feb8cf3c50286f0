// KVTileSet::StreamIn on a framed stream, with its round trip. The number of
// tile blocks is the number of elements of the receiving set's Tiles array,
// so bits 5-6 of the shape byte also choose that array: 1..13 (a new set),
// 0..12, 1..3, or no bounds at all (which fails after TSN). Tiles are
// stored through Tiles set, which trims their names, so encodings are
// compared with each other rather than with the input.

#include "object_target.hpp"

using namespace kvdata;

namespace {

int& tiles_mode() {
  static int mode = 0;
  return mode;
}

// A set whose Tiles array has the bounds of the current mode.
std::shared_ptr<KVTileSet> shaped_set(const String& tsn) {
  auto set = KVTileSet::create();
  tTileSet record = set->v1TileSet();
  record.TSN = tsn;
  switch (tiles_mode()) {
    case 1:
      record.Tiles.redim(0, 12);
      break;
    case 2:
      record.Tiles.redim(1, 3);
      break;
    case 3:
      record.Tiles.erase();
      break;
    default:
      break;
  }
  if (record.Tiles.has_bounds()) {
    record.Tiles(record.Tiles.ubound()).Name = u"last";
    record.Tiles(record.Tiles.ubound()).ColorRGB = 0x55;
  }
  set->v1TileSet(record);
  return set;
}

fuzz::ObjectStream<KVTileSet> ops() {
  fuzz::ObjectStream<KVTileSet> ops;
  ops.fresh = [] { return shaped_set(u""); };
  ops.known = [] { return shaped_set(u"KNOWN"); };
  ops.after_read = [](const KVTileSet& set, bool ok, Long start, Long end) {
    const tTileSet record = set.v1TileSet();
    KVDATA_FUZZ_CHECK(record.Tiles.has_bounds() == (tiles_mode() != 3),
                      "reading a tile set changed its Tiles bounds");
    if (!ok || !record.Tiles.has_bounds()) return;
    const long long blocks = static_cast<long long>(record.Tiles.size());
    const long long tsn_bytes = 4 + static_cast<long long>(ansi::encode(record.TSN).size());
    KVDATA_FUZZ_CHECK(static_cast<long long>(end) - start == tsn_bytes + 264 * blocks,
                      "a tile set read took other than its TSN and its blocks");
  };
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::ObjectStream<KVTileSet> kOps = ops();
  tiles_mode() = size > 0 ? (data[0] >> 5) & 0x03 : 0;
  return fuzz::object_target(data, size, kOps);
}
