// KVTile::StreamIn on a framed stream, with its round trip. The tile block
// is a raw 264-byte image: a success takes exactly those bytes and writes
// them back unchanged; a failure leaves the tile as it was.

#include "object_target.hpp"

using namespace kvdata;

namespace {

std::shared_ptr<KVTile> known_tile() {
  auto tile = KVTile::create();
  tile->ColorName(u"Known");
  tile->ColorRGB(0x102030);
  tile->TempCompWL(7, 1.5);
  return tile;
}

fuzz::ObjectStream<KVTile> ops() {
  fuzz::ObjectStream<KVTile> ops;
  ops.fresh = [] { return KVTile::create(); };
  ops.known = known_tile;
  ops.whole_or_nothing = true;
  ops.canonical = true;
  ops.after_read = [](const KVTile& tile, bool ok, Long start, Long end) {
    if (ok)
      KVDATA_FUZZ_CHECK(static_cast<long long>(end) - start == 264,
                        "a tile read took other than 264 bytes");
    KVDATA_FUZZ_CHECK(tile.Order() == 0, "reading a tile changed its Order");
  };
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::ObjectStream<KVTile> kOps = ops();
  return fuzz::object_target(data, size, kOps);
}
