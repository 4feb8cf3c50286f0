#include "kvdata/objects/kv_tile.hpp"

#include "automation/detail/failure.hpp"
#include "kvdata/automation/error.hpp"
#include "objects/detail/narrow_single.hpp"
#include "objects/detail/object_stream.hpp"
#include "objects/detail/record_image.hpp"
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
  return detail::get_text_field(block_, detail::kTileNameOffset, detail::kTileNameUnits);
}

void KVTile::IKVTile_ColorName(const String& value) {
  detail::set_text_field(block_, detail::kTileNameOffset, detail::kTileNameUnits, value);
  write_back();
}

Long KVTile::IKVTile_ColorRGB() const {
  return detail::get_field<Long>(block_, detail::kTileColorRGBOffset);
}

void KVTile::IKVTile_ColorRGB(Long value) {
  detail::set_field<Long>(block_, detail::kTileColorRGBOffset, value);
  write_back();
}

Double KVTile::IKVTile_TempCompWL(const Integer& idx) const {
  if (idx < 1 || idx > kBandCount) return 0.0;
  return static_cast<Double>(detail::get_field<Single>(block_, detail::tile_band_offset(idx)));
}

void KVTile::IKVTile_TempCompWL(const Integer& idx, const Double& value) {
  if (idx >= 1 && idx <= kBandCount) {
    detail::set_field<Single>(block_, detail::tile_band_offset(idx),
                              detail::narrow_to_single(value));
  }
  write_back();
}

bool KVTile::IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) {
  detail::TileBlock scratch{};
  if (!detail::take_block(bytStream, Position, scratch)) return false;
  block_ = scratch;
  return true;
}

bool KVTile::IKVStream_StreamOut(ByteArray& bytStream, Long& Position) {
  return detail::false_on_failure([&] {
    if (Position < 0) return false;  // before any array a writer makes
    detail::resize_stream(bytStream, detail::index_after(Position, kTileBlockBytes));
    return detail::put_block(bytStream, Position, block_);
  });
}

Long KVTile::IKVStream_StreamLen() const {
  return static_cast<Long>(kTileBlockBytes);
}

}  // namespace kvdata
