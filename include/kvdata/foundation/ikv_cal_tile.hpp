#pragma once
// One tile's certified spectra in a calibration: its position and the SCE and
// SCI values per band.
//
//   tile->SCWL(kvdata::eSC::SCI, 40, 87.5);   // band 40, specular included
//   tile->SCWL(kvdata::eSC::SCI, 40) == 87.5;

#include "kvdata/automation/object.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/enums.hpp"

namespace kvdata {

// A tile handed out by a calibration writes every change made through these
// lets back into the calibration at its Order; an error raised by the
// calibration reaches the caller of the let.
class IKVCalTile : public virtual Object {
 public:
  // Position of the tile in its calibration. The let writes the tile back at the new Order.
  Integer Order() const { return IKVCalTile_Order(); }
  void Order(Integer value) { IKVCalTile_Order(value); }
  // Value of band `WL` (1 to 40) of spectrum `sc`; 0 for any other band whatever `sc`.
  // A band in range with `sc` other than SCE or SCI raises error 9.
  Double SCWL(const eSC& sc, const Integer& WL) const { return IKVCalTile_SCWL(sc, WL); }
  // Stores the value narrowed to Single for band `WL` (1 to 40); any other band stores
  // nothing. A band in range with `sc` other than SCE or SCI raises error 9 and changes
  // nothing; otherwise the tile is then written back.
  void SCWL(const eSC& sc, const Integer& WL, const Double& value) {
    IKVCalTile_SCWL(sc, WL, value);
  }

 protected:
  virtual Integer IKVCalTile_Order() const = 0;
  virtual void IKVCalTile_Order(Integer value) = 0;
  virtual Double IKVCalTile_SCWL(const eSC& sc, const Integer& WL) const = 0;
  virtual void IKVCalTile_SCWL(const eSC& sc, const Integer& WL, const Double& value) = 0;
};

}  // namespace kvdata
