#include "kvdata/objects/kv_tile.hpp"

#include "automation/detail/failure.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "objects/detail/narrow_single.hpp"
#include "objects/detail/object_stream.hpp"
#include "objects/detail/property_names.hpp"
#include "objects/detail/record_image.hpp"
#include "objects/detail/tile_block.hpp"
#include "streams/detail/observe.hpp"

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
  const detail::ObservedRecord property(stream_observer(), detail::property_name<KVTile>("v1Tile"));
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
  return detail::get_text_field(block_, detail::kTileName);
}

void KVTile::IKVTile_ColorName(const String& value) {
  detail::set_text_field(block_, detail::kTileName, value);
  write_back();
}

Long KVTile::IKVTile_ColorRGB() const {
  return detail::get_field<Long>(block_, detail::kTileColorRGB);
}

void KVTile::IKVTile_ColorRGB(Long value) {
  detail::set_field<Long>(block_, detail::kTileColorRGB, value);
  write_back();
}

Double KVTile::IKVTile_TempCompWL(const Integer& idx) const {
  if (idx < 1 || idx > kBandCount) return 0.0;
  return static_cast<Double>(detail::get_field<Single>(block_, detail::kTileTempComp, static_cast<std::size_t>(idx - 1)));
}

void KVTile::IKVTile_TempCompWL(const Integer& idx, const Double& value) {
  if (idx >= 1 && idx <= kBandCount) {
    detail::set_field<Single>(block_, detail::kTileTempComp, detail::narrow_to_single(value),
                              static_cast<std::size_t>(idx - 1));
  }
  write_back();
}

bool KVTile::IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) {
  detail::TileBlock scratch{};
  const Long start = Position;
  const bool whole = detail::take_block(bytStream, Position, scratch);
  if (StreamObserver* const observer = stream_observer()) {
    const detail::ObservedRecord property(observer, detail::property_name<KVTile>("v1Tile"));
    const auto taken = static_cast<std::size_t>(static_cast<long long>(Position) - start);
    static_cast<void>(
        detail::observe_tile(*observer, std::span<const Byte>(scratch).first(taken), start));
  }
  if (!whole) return false;
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
