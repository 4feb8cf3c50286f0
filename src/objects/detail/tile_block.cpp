#include "objects/detail/tile_block.hpp"

#include <cassert>

#include "kvdata/streams/stream_observer.hpp"

namespace kvdata::detail {

void encode_tile(const tTileDef& def, std::span<Byte, kTileBlockBytes> block, Long position) {
  [[maybe_unused]] const bool inside =
      store_fields(def, kTileLayout.cells, block, stream_observer(), position);
  assert(inside);
}

tTileDef decode_tile(std::span<const Byte, kTileBlockBytes> block) {
  tTileDef def;
  [[maybe_unused]] const bool inside = load_fields(block, kTileLayout.cells, def);
  assert(inside);
  return def;
}

bool observe_tile(StreamObserver& observer, std::span<const Byte> present, Long position) {
  return observe_block(observer, kTileLayout.cells, present, position);
}

}  // namespace kvdata::detail
