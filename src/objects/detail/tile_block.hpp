#pragma once
// The 264-byte tile block: the form in which a tile holds its definition and
// in which tiles and tile sets stream it. Offsets from the block's start,
// multi-byte values little-endian:
//
//   0    100  name, 50 UTF-16 code units, left-aligned
//   100    4  ColorRGB, signed 32-bit
//   104  160  TempComp, 40 Singles, band 1 first
//
//   kvdata::detail::TileBlock block{};
//   kvdata::detail::encode_tile(def, block);   // name cut or padded to 50 units

#include <array>
#include <cstddef>
#include <span>

#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/records.hpp"
#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {

inline constexpr std::size_t kTileNameOffset = 0;
inline constexpr std::size_t kTileNameUnits = 50;
inline constexpr std::size_t kTileColorRGBOffset = 100;
inline constexpr std::size_t kTileTempCompOffset = 104;
inline constexpr std::size_t kTileBlockBytes = 264;
static_assert(kTileColorRGBOffset == kTileNameOffset + text_bytes(kTileNameUnits));
static_assert(kTileTempCompOffset == kTileColorRGBOffset + kWireWidth<Long>);
static_assert(kTileBlockBytes ==
              kTileTempCompOffset + static_cast<std::size_t>(kBandCount) * kWireWidth<Single>);

using TileBlock = std::array<Byte, kTileBlockBytes>;

// Offset of TempComp band `band`, 1 to 40.
constexpr std::size_t tile_band_offset(Long band) {
  return kTileTempCompOffset + static_cast<std::size_t>(band - 1) * kWireWidth<Single>;
}

// Stores the whole definition; the name is cut at 50 units or padded with U+0020.
void encode_tile(const tTileDef& def, std::span<Byte, kTileBlockBytes> block);

// The definition in the block, its name without leading and trailing U+0020.
tTileDef decode_tile(std::span<const Byte, kTileBlockBytes> block);

}  // namespace kvdata::detail
