#pragma once
// One certification of a reference tile set, held as its 4188-byte block:
// TSN (8 UTF-16 code units), date of certification, calibration temperature
// and the SCE and SCI spectra of 13 tiles. Tiles are read and edited through
// KVCalTile objects that write their changes back; the calibration keeps no
// reference to them.
//
//   auto cal = kvdata::KVCalibration::create();
//   cal->Tiles(13)->SCWL(kvdata::eSC::SCI, 40, 87.5);   // block offset 4184

#include <array>
#include <cstddef>
#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/ikv_cal_tile.hpp"
#include "kvdata/foundation/ikv_calibration.hpp"
#include "kvdata/foundation/ikv_db_object.hpp"
#include "kvdata/foundation/ikv_obj.hpp"
#include "kvdata/foundation/ikv_security.hpp"
#include "kvdata/foundation/ikv_stream.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

class KVCalibration : public InertDBObject,
                      public IKVObj,
                      public IKVCalibration,
                      public IKVStream,
                      public InertSecurity {
 public:
  // The block StreamIn reads and StreamOut writes.
  static constexpr std::size_t kStreamBytes = 4188;

  // All zero: TSN of 8 U+0000 units, date 0, temperature 0, all spectra 0.
  static std::shared_ptr<KVCalibration> create();

  // Stores TSN (cut or padded to 8 units), date and temperature, then copies
  // Tiles(1) to Tiles(13) of the record in index order. An index missing from the
  // record's Tiles raises error 9 there; what was copied before it stays.
  void v1Calibration(const tTileSetCalibration& value);
  // TSN without leading and trailing U+0020 (the stored field is unchanged), date,
  // temperature, and a new Tiles array with bounds 1 to 13.
  tTileSetCalibration v1Calibration() const;

 protected:
  String IKVObj_ObjType() const override;
  String IKVObj_Description() const override;
  Variant IKVObj_ID() const override;
  Variant IKVObj_DateCreated() const override;

  String IKVCalibration_TSN() const override;
  void IKVCalibration_TSN(const String& value) override;
  Date IKVCalibration_DateCertified() const override;
  void IKVCalibration_DateCertified(Date value) override;
  Single IKVCalibration_TempCalibrated() const override;
  void IKVCalibration_TempCalibrated(Single value) override;
  void IKVCalibration_Tiles(Integer idx, const std::shared_ptr<IKVCalTile>& tile) override;
  std::shared_ptr<IKVCalTile> IKVCalibration_Tiles(Integer idx) override;

  // Reads the 4188-byte block at Position. When the array ends first, returns False
  // with Position advanced by the bytes that were there and the object unchanged.
  bool IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) override;
  // Sets the array's bounds to 0 .. Position + 4188 (contents kept), writes the block
  // and leaves Position at the upper bound. A negative Position or one whose end would
  // overflow a Long changes nothing.
  bool IKVStream_StreamOut(ByteArray& bytStream, Long& Position) override;
  // Always 4188.
  Long IKVStream_StreamLen() const override;

 private:
  KVCalibration() = default;

  std::array<Byte, 4188> block_{};
};

}  // namespace kvdata
