#include "kvdata/objects/kv_cal_tile.hpp"

#include "kvdata/automation/error.hpp"
#include "objects/detail/narrow_single.hpp"

namespace kvdata {

std::shared_ptr<KVCalTile> KVCalTile::create() {
  return std::shared_ptr<KVCalTile>(new KVCalTile());
}

tSCPair KVCalTile::v1Tile() const {
  return spectra_;
}

void KVCalTile::v1Tile(const tSCPair& value) {
  spectra_ = value;
  write_back();
}

void KVCalTile::write_back() {
  if (!parent_) return;
  parent_->Tiles(order_, std::dynamic_pointer_cast<KVCalTile>(shared_from_this()));
}

Integer KVCalTile::IKVCalTile_Order() const {
  return order_;
}

void KVCalTile::IKVCalTile_Order(Integer value) {
  order_ = value;
  write_back();
}

Double KVCalTile::IKVCalTile_SCWL(const eSC& sc, const Integer& WL) const {
  if (WL < 1 || WL > kBandCount) return 0.0;
  // The spectrum index is checked (error 9 for anything but SCE and SCI).
  return static_cast<Double>(spectra_.Spectrum(sc).Data(WL));
}

void KVCalTile::IKVCalTile_SCWL(const eSC& sc, const Integer& WL, const Double& value) {
  if (WL >= 1 && WL <= kBandCount) {
    spectra_.Spectrum(sc).Data(WL) = detail::narrow_to_single(value);
  }
  write_back();
}

}  // namespace kvdata
