#pragma once
// The 264-byte tile block: the form in which a tile holds its definition and
// in which tiles and tile sets stream it. Cells from the block's start,
// multi-byte values little-endian:
//
//   0    100  Name, 50 UTF-16 code units, left-aligned
//   100    4  ColorRGB, signed 32-bit
//   104  160  TempComp, 40 Singles, band 1 first
//
//   kvdata::detail::TileBlock block{};
//   kvdata::detail::encode_tile(def, block);   // name cut or padded to 50 units

#include <array>
#include <cstddef>
#include <span>

#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/record_fields.hpp"
#include "kvdata/foundation/records.hpp"
#include "kvdata/objects/kv_tile.hpp"
#include "streams/detail/block_layout.hpp"

namespace kvdata::detail {

inline constexpr auto kTileLayout = block_layout<3>({
    text_cell(field_name<&tTileDef::Name>(), 50),
    long_cell(field_name<&tTileDef::ColorRGB>()),
    singles_cell(field_name<&tTileDef::TempComp>(), kBandCount),
});
inline constexpr const Cell& kTileName = kTileLayout.at(field_name<&tTileDef::Name>());
inline constexpr const Cell& kTileColorRGB = kTileLayout.at(field_name<&tTileDef::ColorRGB>());
inline constexpr const Cell& kTileTempComp = kTileLayout.at(field_name<&tTileDef::TempComp>());
inline constexpr std::size_t kTileBlockBytes = kTileLayout.bytes;
static_assert(kTileBlockBytes == KVTile::kStreamBytes);

using TileBlock = std::array<Byte, kTileBlockBytes>;

// Stores the whole definition; the name is cut at 50 units or padded with
// U+0020. The observer installed on this thread sees the name as given, at
// stream index `position` plus its offset.
void encode_tile(const tTileDef& def, std::span<Byte, kTileBlockBytes> block, Long position = 0);

// The definition in the block, its name without leading and trailing U+0020.
tTileDef decode_tile(std::span<const Byte, kTileBlockBytes> block);

// Reports the block read from `present` (as many of its bytes as the stream
// held), starting at stream index `position`; false when it was cut short.
bool observe_tile(StreamObserver& observer, std::span<const Byte> present, Long position);

}  // namespace kvdata::detail
