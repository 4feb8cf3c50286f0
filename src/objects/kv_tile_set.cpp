#include "kvdata/objects/kv_tile_set.hpp"

#include <cstddef>
#include <limits>
#include <new>
#include <string_view>
#include <utility>

#include "automation/detail/failure.hpp"
#include "kvdata/automation/ansi.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/objects/kv_tile.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "objects/detail/object_stream.hpp"
#include "objects/detail/property_names.hpp"
#include "objects/detail/tile_block.hpp"
#include "streams/detail/checked_codec.hpp"
#include "streams/detail/field_cursor.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/detail/observe.hpp"

namespace kvdata {
namespace {

// The size of a tile set: count, the indexes Tiles set accepts, the tiles StreamLen counts.
constexpr Integer kTileCount = 13;

bool is_tile_index(long long idx) {
  return idx >= 1 && idx <= kTileCount;
}

// Tile indexes are Integers: an element outside their range cannot be addressed.
bool fits_integer(long long idx) {
  return idx >= std::numeric_limits<Integer>::min() && idx <= std::numeric_limits<Integer>::max();
}

// Bytes of TSN as a codec String: the 4-byte count and the Windows-1252 text.
std::size_t tsn_field_bytes(const String& tsn) {
  return detail::kWireWidth<Long> + ansi::encode(tsn).size();
}

constexpr std::string_view kProperty = detail::property_name<KVTileSet>("v1TileSet");
constexpr std::string_view kTiles = field_name<&tTileSet::Tiles>();

}  // namespace

std::shared_ptr<KVTileSet> KVTileSet::create() {
  return std::shared_ptr<KVTileSet>(new KVTileSet());
}

KVTileSet::KVTileSet() {
  record_.Tiles.redim(1, kTileCount);
}

void KVTileSet::v1TileSet(const tTileSet& value) {
  tTileSet copy = value;  // a copy that fails leaves the record as it was
  record_ = std::move(copy);
}

tTileSet KVTileSet::v1TileSet() const {
  return record_;
}

String KVTileSet::IKVObj_ObjType() const {
  return u"TileSet";
}
String KVTileSet::IKVObj_Description() const {
  return u"Tile Set";
}
Variant KVTileSet::IKVObj_ID() const {
  return Variant(record_.TSN);
}
Variant KVTileSet::IKVObj_DateCreated() const {
  return Variant();
}

String KVTileSet::IKVTileSet_TSN() const {
  return record_.TSN;
}
void KVTileSet::IKVTileSet_TSN(const String& value) {
  record_.TSN = value;
}

void KVTileSet::IKVTileSet_Tiles(Integer idx, const std::shared_ptr<IKVTile>& tile) {
  if (!tile) raise(kObjectNotSet);
  const auto source = std::dynamic_pointer_cast<KVTile>(tile);
  if (!source) raise(kTypeMismatch);
  if (!is_tile_index(idx)) return;
  tTileDef def = source->v1Tile();
  record_.Tiles(idx) = std::move(def);  // error 9 when a replaced array lacks idx
}

std::shared_ptr<IKVTile> KVTileSet::IKVTileSet_Tiles(Integer idx) {
  auto tile = KVTile::create();
  // Asking for the bounds raises error 9 on an array without any.
  if (idx >= record_.Tiles.lbound() && idx <= record_.Tiles.ubound()) {
    tile->v1Tile(record_.Tiles(idx));
  }
  // Order and contents are set before the parent, so handing out writes nothing back.
  tile->Order(idx);
  tile->set_parent(std::dynamic_pointer_cast<IKVTileSet>(shared_from_this()));
  return tile;
}

Long KVTileSet::IKVTileSet_count() const {
  return kTileCount;
}

bool KVTileSet::IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) {
  return detail::false_on_failure([&] {
    detail::FieldReader in(bytStream, Position);
    StreamObserver* const observer = in.observer();
    const detail::ObservedRecord property(observer, kProperty);
    String tsn;
    if (!in.get_string(tsn, field_name<&tTileSet::TSN>()).ok()) return false;
    record_.TSN = std::move(tsn);
    const long long lower = record_.Tiles.lbound();
    const long long upper = record_.Tiles.ubound();
    for (long long i = lower; i <= upper; ++i) {
      if (!fits_integer(i)) return false;
      detail::TileBlock block{};
      const Long start = Position;
      const bool whole = detail::take_block(bytStream, Position, block);
      if (observer != nullptr) {
        const detail::ObservedRecord tile(observer, kTiles, static_cast<Long>(i));
        const auto taken = static_cast<std::size_t>(static_cast<long long>(Position) - start);
        static_cast<void>(
            detail::observe_tile(*observer, std::span<const Byte>(block).first(taken), start));
      }
      if (!whole) return false;
      if (is_tile_index(i)) record_.Tiles(static_cast<Long>(i)) = detail::decode_tile(block);
    }
    return true;
  });
}

bool KVTileSet::IKVStream_StreamOut(ByteArray& bytStream, Long& Position) {
  return detail::false_on_failure([&] {
    if (Position < 0) return false;  // before any array a writer makes
    const std::size_t tiles = record_.Tiles.has_bounds() ? record_.Tiles.size() : 0;
    const std::size_t total = tsn_field_bytes(record_.TSN) + tiles * detail::kTileBlockBytes;
    detail::resize_stream(bytStream, detail::index_after(Position, total));
    if (!checked::write_string(record_.TSN, bytStream, Position)) return false;
    StreamObserver* const observer = stream_observer();
    const detail::ObservedRecord property(observer, kProperty);
    const long long lower = record_.Tiles.lbound();
    const long long upper = record_.Tiles.ubound();
    for (long long i = lower; i <= upper; ++i) {
      const detail::ObservedRecord tile(observer, kTiles, static_cast<Long>(i));
      detail::TileBlock block{};
      detail::encode_tile(record_.Tiles(static_cast<Long>(i)), block, Position);
      if (!detail::put_block(bytStream, Position, block)) return false;
    }
    return true;
  });
}

Long KVTileSet::IKVStream_StreamLen() const {
  const std::size_t length = tsn_field_bytes(record_.TSN) + kTileCount * detail::kTileBlockBytes;
  if (length > static_cast<std::size_t>(std::numeric_limits<Long>::max())) raise(kOverflow);
  return static_cast<Long>(length);
}

}  // namespace kvdata
