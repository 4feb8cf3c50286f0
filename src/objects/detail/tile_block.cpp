#include "objects/detail/tile_block.hpp"

#include "objects/detail/record_image.hpp"

namespace kvdata::detail {

void encode_tile(const tTileDef& def, std::span<Byte, kTileBlockBytes> block) {
  set_text_field(block, kTileNameOffset, kTileNameUnits, def.Name);
  set_field<Long>(block, kTileColorRGBOffset, def.ColorRGB);
  for (Long band = 1; band <= kBandCount; ++band) {
    set_field<Single>(block, tile_band_offset(band), def.TempComp.Data(band));
  }
}

tTileDef decode_tile(std::span<const Byte, kTileBlockBytes> block) {
  tTileDef def;
  def.Name = get_text_field(block, kTileNameOffset, kTileNameUnits);
  def.ColorRGB = get_field<Long>(block, kTileColorRGBOffset);
  for (Long band = 1; band <= kBandCount; ++band) {
    def.TempComp.Data(band) = get_field<Single>(block, tile_band_offset(band));
  }
  return def;
}

}  // namespace kvdata::detail
