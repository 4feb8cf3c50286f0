#include "kvdata/objects/kv_tile.hpp"

#include "kvdata/automation/text.hpp"
#include "objects/detail/block_fields.hpp"
#include "objects/detail/block_stream.hpp"
#include "objects/detail/narrow_single.hpp"
#include "objects/detail/tile_block.hpp"

namespace kvdata {

using detail::kTileBlockBytes;

std::shared_ptr<KVTile> KVTile::create() {
  static_assert(std::tuple_size_v<decltype(block_)> == kTileBlockBytes);
  return std::shared_ptr<KVTile>(new KVTile());
}

tTileDef KVTile::v1Tile() const {
  return detail::decode_tile(block_);
}

void KVTile::v1Tile(const tTileDef& value) {
  detail::encode_tile(value, block_);
  write_back();
}

void KVTile::write_back() {
  if (!parent_) return;
  parent_->Tiles(order_, std::dynamic_pointer_cast<KVTile>(shared_from_this()));
}

Integer KVTile::IKVTile_Order() const {
  return order_;
}

void KVTile::IKVTile_Order(Integer value) {
  order_ = value;
  write_back();
}

String KVTile::IKVTile_ColorName() const {
  return trim_blanks(detail::block_text(block_, detail::kTileNameOffset, detail::kTileNameUnits));
}

void KVTile::IKVTile_ColorName(const String& value) {
  detail::block_set_text(block_, detail::kTileNameOffset, detail::kTileNameUnits, value);
  write_back();
}

Long KVTile::IKVTile_ColorRGB() const {
  return detail::block_get<Long>(block_, detail::kTileColorRGBOffset);
}

void KVTile::IKVTile_ColorRGB(Long value) {
  detail::block_set<Long>(block_, detail::kTileColorRGBOffset, value);
  write_back();
}

Double KVTile::IKVTile_TempCompWL(const Integer& idx) const {
  if (idx < 1 || idx > kBandCount) return 0.0;
  return static_cast<Double>(detail::block_get<Single>(block_, detail::tile_band_offset(idx)));
}

void KVTile::IKVTile_TempCompWL(const Integer& idx, const Double& value) {
  if (idx >= 1 && idx <= kBandCount) {
    detail::block_set<Single>(block_, detail::tile_band_offset(idx),
                              detail::narrow_to_single(value));
  }
  write_back();
}

bool KVTile::IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) {
  detail::TileBlock scratch{};
  if (!detail::read_block(bytStream, Position, scratch)) return false;
  block_ = scratch;
  return true;
}

bool KVTile::IKVStream_StreamOut(ByteArray& bytStream, Long& Position) {
  if (!detail::size_stream_to_end(bytStream, Position, kTileBlockBytes)) return false;
  return detail::write_block(bytStream, Position, block_);
}

Long KVTile::IKVStream_StreamLen() const {
  return static_cast<Long>(kTileBlockBytes);
}

}  // namespace kvdata
