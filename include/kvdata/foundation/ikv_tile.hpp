#pragma once
// One reference tile's definition: its position in the tile set, its name,
// its display colour and its temperature-compensation value per band.
//
//   tile->ColorName(u"Red");  tile->TempCompWL(40, 0.25);
//   tile->TempCompWL(40) == 0.25;   // band 40, not 400 nm

#include "kvdata/automation/object.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata {

// A tile handed out by a tile set writes every change made through these lets
// back into the set at its Order; an error raised by the set reaches the
// caller of the let.
class IKVTile : public virtual Object {
 public:
  // Position of the tile in its tile set. The let writes the tile back at the new Order;
  // the old position keeps what it had.
  Integer Order() const { return IKVTile_Order(); }
  void Order(Integer value) { IKVTile_Order(value); }
  // The name without leading and trailing U+0020 (U+0000 units of a name never set stay).
  String ColorName() const { return IKVTile_ColorName(); }
  // Stores the name cut at 50 code units or padded with U+0020.
  void ColorName(const String& value) { IKVTile_ColorName(value); }
  // Display colour, stored and returned unchanged.
  Long ColorRGB() const { return IKVTile_ColorRGB(); }
  void ColorRGB(Long value) { IKVTile_ColorRGB(value); }
  // Temperature compensation of band `idx` (1 to 40); 0 for any other index.
  Double TempCompWL(const Integer& idx) const { return IKVTile_TempCompWL(idx); }
  // Stores the value narrowed to Single for band `idx` (1 to 40); any other index stores
  // nothing. Either way the tile is then written back.
  void TempCompWL(const Integer& idx, const Double& value) { IKVTile_TempCompWL(idx, value); }

 protected:
  virtual Integer IKVTile_Order() const = 0;
  virtual void IKVTile_Order(Integer value) = 0;
  virtual String IKVTile_ColorName() const = 0;
  virtual void IKVTile_ColorName(const String& value) = 0;
  virtual Long IKVTile_ColorRGB() const = 0;
  virtual void IKVTile_ColorRGB(Long value) = 0;
  virtual Double IKVTile_TempCompWL(const Integer& idx) const = 0;
  virtual void IKVTile_TempCompWL(const Integer& idx, const Double& value) = 0;
};

}  // namespace kvdata
