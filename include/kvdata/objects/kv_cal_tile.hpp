#pragma once
// One tile's certified spectra (SCE and SCI, 40 bands each). A tile handed
// out by a calibration remembers the calibration and writes every change
// back into it at the tile's Order. It has no byte-stream form of its own.
//
//   auto tile = kvdata::KVCalTile::create();
//   tile->SCWL(kvdata::eSC::SCE, 1, 42.0);   // band 1 (360 nm), specular excluded

#include <memory>

#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/enums.hpp"
#include "kvdata/foundation/ikv_cal_tile.hpp"
#include "kvdata/foundation/ikv_calibration.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

class KVCalibration;

class KVCalTile : public IKVCalTile {
 public:
  // A free-standing tile: all spectra zero, Order 0, no parent.
  static std::shared_ptr<KVCalTile> create();

  tSCPair v1Tile() const;
  // Takes both spectra, then writes the tile back into its parent; an error of the
  // parent reaches the caller.
  void v1Tile(const tSCPair& value);

 protected:
  Integer IKVCalTile_Order() const override;
  void IKVCalTile_Order(Integer value) override;
  Double IKVCalTile_SCWL(const eSC& sc, const Integer& WL) const override;
  void IKVCalTile_SCWL(const eSC& sc, const Integer& WL, const Double& value) override;

 private:
  // The calibration hands tiles out attached to itself; nothing else sets the parent.
  friend class KVCalibration;

  KVCalTile() = default;
  void set_parent(std::shared_ptr<IKVCalibration> parent) { parent_ = std::move(parent); }
  // Stores this tile into the parent at Order; nothing without a parent.
  void write_back();

  Integer order_ = 0;
  tSCPair spectra_;
  std::shared_ptr<IKVCalibration> parent_;
};

}  // namespace kvdata
