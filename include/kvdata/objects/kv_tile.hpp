#pragma once
// One reference tile's definition, held as its 264-byte tile block: name (50
// UTF-16 code units), display colour and 40 temperature-compensation values.
// A tile handed out by a tile set remembers the set and writes every change
// back into it at the tile's Order.
//
//   auto tile = kvdata::KVTile::create();
//   tile->ColorName(u"Red");  tile->StreamOut(bytes);   // 264 bytes at index 0

#include <array>
#include <cstddef>
#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/ikv_stream.hpp"
#include "kvdata/foundation/ikv_tile.hpp"
#include "kvdata/foundation/ikv_tile_set.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

class KVTileSet;

class KVTile : public IKVTile, public IKVStream {
 public:
  // The tile block StreamIn reads and StreamOut writes.
  static constexpr std::size_t kStreamBytes = 264;

  // A free-standing tile: all zero (50 U+0000 name units), Order 0, no parent.
  static std::shared_ptr<KVTile> create();

  // The definition: the name trimmed as ColorName returns it, the colour and all 40 values.
  tTileDef v1Tile() const;
  // Takes the name (cut or padded to 50 units), the colour and all 40 values, then
  // writes the tile back into its parent; an error of the parent reaches the caller.
  void v1Tile(const tTileDef& value);

 protected:
  Integer IKVTile_Order() const override;
  void IKVTile_Order(Integer value) override;
  String IKVTile_ColorName() const override;
  void IKVTile_ColorName(const String& value) override;
  Long IKVTile_ColorRGB() const override;
  void IKVTile_ColorRGB(Long value) override;
  Double IKVTile_TempCompWL(const Integer& idx) const override;
  void IKVTile_TempCompWL(const Integer& idx, const Double& value) override;

  // Reads a 264-byte tile block at Position. When the array ends first, returns
  // False with Position advanced by the bytes that were there and the tile
  // unchanged. Order and parent are never touched, and nothing is written back.
  bool IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) override;
  // Sets the array's bounds to 0 .. Position + 264 (contents kept, a longer array
  // shortened), writes the block at Position and leaves Position at the upper bound.
  // A negative Position, or one whose end would overflow a Long, returns False and
  // changes nothing.
  bool IKVStream_StreamOut(ByteArray& bytStream, Long& Position) override;
  // Always 264.
  Long IKVStream_StreamLen() const override;

 private:
  // The tile set hands tiles out attached to itself; nothing else sets the parent.
  friend class KVTileSet;

  KVTile() = default;
  void set_parent(std::shared_ptr<IKVTileSet> parent) { parent_ = std::move(parent); }
  // Stores this tile into the parent at Order; nothing without a parent.
  void write_back();

  std::array<Byte, 264> block_{};
  Integer order_ = 0;
  std::shared_ptr<IKVTileSet> parent_;
};

}  // namespace kvdata
