#pragma once
// One certification of a tile set: its serial number (8 characters), the
// date of certification, the calibration temperature and the certified
// spectra of its 13 tiles, read and edited one tile at a time.
//
//   auto tile = cal->Tiles(13);                 // attached at Order 13
//   tile->SCWL(kvdata::eSC::SCI, 40, 87.5);     // lands in slot 13 of the calibration

#include <memory>

#include "kvdata/automation/object.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/ikv_cal_tile.hpp"

namespace kvdata {

class IKVCalibration : public virtual Object {
 public:
  // All 8 stored code units, padding and U+0000 units included.
  String TSN() const { return IKVCalibration_TSN(); }
  // Stores the text cut at 8 code units or padded with U+0020.
  void TSN(const String& value) { IKVCalibration_TSN(value); }
  Date DateCertified() const { return IKVCalibration_DateCertified(); }
  void DateCertified(Date value) { IKVCalibration_DateCertified(value); }
  Single TempCalibrated() const { return IKVCalibration_TempCalibrated(); }
  void TempCalibrated(Single value) { IKVCalibration_TempCalibrated(value); }
  // Copies the tile's spectra into slot `idx` (1 to 13; other indexes are ignored).
  // A tile of another class raises error 13 whatever `idx` is.
  void Tiles(Integer idx, const std::shared_ptr<IKVCalTile>& tile) {
    IKVCalibration_Tiles(idx, tile);
  }
  // A new tile holding a copy of slot `idx` (all zero outside 1 to 13), attached to
  // this calibration at Order `idx`.
  std::shared_ptr<IKVCalTile> Tiles(Integer idx) { return IKVCalibration_Tiles(idx); }

 protected:
  virtual String IKVCalibration_TSN() const = 0;
  virtual void IKVCalibration_TSN(const String& value) = 0;
  virtual Date IKVCalibration_DateCertified() const = 0;
  virtual void IKVCalibration_DateCertified(Date value) = 0;
  virtual Single IKVCalibration_TempCalibrated() const = 0;
  virtual void IKVCalibration_TempCalibrated(Single value) = 0;
  virtual void IKVCalibration_Tiles(Integer idx, const std::shared_ptr<IKVCalTile>& tile) = 0;
  virtual std::shared_ptr<IKVCalTile> IKVCalibration_Tiles(Integer idx) = 0;
};

}  // namespace kvdata
