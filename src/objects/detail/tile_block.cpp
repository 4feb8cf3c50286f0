#include "objects/detail/tile_block.hpp"

#include "kvdata/automation/text.hpp"
#include "objects/detail/block_fields.hpp"

namespace kvdata::detail {

void encode_tile(const tTileDef& def, std::span<Byte, kTileBlockBytes> block) {
  block_set_text(block, kTileNameOffset, kTileNameUnits, def.Name);
  block_set<Long>(block, kTileColorRGBOffset, def.ColorRGB);
  for (Long band = 1; band <= kBandCount; ++band) {
    block_set<Single>(block, tile_band_offset(band), def.TempComp.Data(band));
  }
}

tTileDef decode_tile(std::span<const Byte, kTileBlockBytes> block) {
  tTileDef def;
  def.Name = trim_blanks(block_text(block, kTileNameOffset, kTileNameUnits));
  def.ColorRGB = block_get<Long>(block, kTileColorRGBOffset);
  for (Long band = 1; band <= kBandCount; ++band) {
    def.TempComp.Data(band) = block_get<Single>(block, tile_band_offset(band));
  }
  return def;
}

}  // namespace kvdata::detail
