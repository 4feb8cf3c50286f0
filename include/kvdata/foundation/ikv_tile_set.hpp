#pragma once
// A reference tile set: its serial number and its 13 tile definitions, read
// and edited one tile at a time.
//
//   auto tile = set->Tiles(5);   // a new tile attached to the set at Order 5
//   tile->ColorRGB(0xFF0000);    // lands in element 5 of the set's record

#include <memory>

#include "kvdata/automation/object.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/ikv_tile.hpp"

namespace kvdata {

class IKVTileSet : public virtual Object {
 public:
  // The serial number as an ordinary String (no length limit, no trimming).
  String TSN() const { return IKVTileSet_TSN(); }
  void TSN(const String& value) { IKVTileSet_TSN(value); }
  // Copies the tile's definition into element `idx` (1 to 13; other indexes are
  // ignored). A tile of another class raises error 13 whatever `idx` is; an index
  // missing from a replaced tile array raises error 9.
  void Tiles(Integer idx, const std::shared_ptr<IKVTile>& tile) { IKVTileSet_Tiles(idx, tile); }
  // A new tile holding a copy of element `idx` (empty when the array has no such
  // element), attached to this set at Order `idx`. Handing it out writes nothing back.
  std::shared_ptr<IKVTile> Tiles(Integer idx) { return IKVTileSet_Tiles(idx); }
  // The number of tiles of a tile set: always 13.
  Long count() const { return IKVTileSet_count(); }

 protected:
  virtual String IKVTileSet_TSN() const = 0;
  virtual void IKVTileSet_TSN(const String& value) = 0;
  virtual void IKVTileSet_Tiles(Integer idx, const std::shared_ptr<IKVTile>& tile) = 0;
  virtual std::shared_ptr<IKVTile> IKVTileSet_Tiles(Integer idx) = 0;
  virtual Long IKVTileSet_count() const = 0;
};

}  // namespace kvdata
