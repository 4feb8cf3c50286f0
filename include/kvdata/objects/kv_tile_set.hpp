#pragma once
// A reference tile set: its serial number and the definitions of its 13
// tiles, kept as one tTileSet record. Tiles are read and edited through
// KVTile objects that write their changes back into the set; the set keeps
// no reference to them.
//
//   auto set = kvdata::KVTileSet::create();
//   set->Tiles(5)->ColorRGB(0x00FF00);   // element 5 of v1TileSet changes

#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/ikv_db_object.hpp"
#include "kvdata/foundation/ikv_obj.hpp"
#include "kvdata/foundation/ikv_security.hpp"
#include "kvdata/foundation/ikv_stream.hpp"
#include "kvdata/foundation/ikv_tile.hpp"
#include "kvdata/foundation/ikv_tile_set.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Stream form: TSN as a codec String, then one 264-byte tile block per element
// of the Tiles array in index order; no stamp and no tile count, so a reader
// reads as many blocks as its own Tiles array has elements.
class KVTileSet : public InertDBObject,
                  public IKVObj,
                  public IKVStream,
                  public IKVTileSet,
                  public InertSecurity {
 public:
  // Empty TSN and 13 empty tiles (bounds 1 to 13).
  static std::shared_ptr<KVTileSet> create();

  // Replaces the record with a copy, whatever the bounds of its Tiles array.
  void v1TileSet(const tTileSet& value);
  // A copy of the record, Tiles bounds included.
  tTileSet v1TileSet() const;

 protected:
  String IKVObj_ObjType() const override;
  String IKVObj_Description() const override;
  Variant IKVObj_ID() const override;
  Variant IKVObj_DateCreated() const override;

  // Reads TSN, then one block per element of the Tiles array, storing elements 1 to 13
  // as they come. Returns False at the first value that cannot be read whole: TSN
  // then stays as it was and no tile is read; tiles already read stay in the record.
  // An array without bounds fails after TSN.
  bool IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) override;
  // Sets the array's bounds to 0 .. the end of the encoding (contents kept), writes it
  // and leaves Position at the upper bound. A negative Position or one whose end would
  // overflow a Long changes nothing; a Tiles array without bounds fails after TSN.
  bool IKVStream_StreamOut(ByteArray& bytStream, Long& Position) override;
  // The encoded TSN field plus 13 blocks of 264 bytes.
  Long IKVStream_StreamLen() const override;

  String IKVTileSet_TSN() const override;
  void IKVTileSet_TSN(const String& value) override;
  void IKVTileSet_Tiles(Integer idx, const std::shared_ptr<IKVTile>& tile) override;
  std::shared_ptr<IKVTile> IKVTileSet_Tiles(Integer idx) override;
  Long IKVTileSet_count() const override;

 private:
  KVTileSet();

  tTileSet record_;
};

}  // namespace kvdata
