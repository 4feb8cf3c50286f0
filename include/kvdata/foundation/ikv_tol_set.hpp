#pragma once
// A keyed, ordered set of tolerances for one instrument type, with a header.
//
//   set->Add(tol, u"37");
//   set->Item(kvdata::Long{37})->MaxFail();   // key "37"; a missing key gives "MISSING"

#include <memory>

#include "kvdata/automation/collection.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/ikv_tolerance.hpp"

namespace kvdata {

class IKVTolSet : public virtual Object {
 public:
  Long InstTypeID() const { return IKVTolSet_InstTypeID(); }
  void InstTypeID(Long value) { IKVTolSet_InstTypeID(value); }
  // The description text, without leading and trailing blanks, as a String Variant.
  Variant Description() const { return IKVTolSet_Description(); }
  // Description let: stores the value converted to text (255 units, cut or blank-padded).
  void Description(const Variant& value) { IKVTolSet_Description_Let(value); }
  // Description set: the same as let.
  void set_Description(const Variant& value) { IKVTolSet_Description_Set(value); }
  Long ID() const { return IKVTolSet_ID(); }
  void ID(Long value) { IKVTolSet_ID(value); }
  Date CreateDate() const { return IKVTolSet_CreateDate(); }
  void CreateDate(Date value) { IKVTolSet_CreateDate(value); }
  // Appends `newTol` under `sKey` (no key when empty); a duplicate key raises error 457.
  void Add(const std::shared_ptr<IKVTolerance>& newTol, const String& sKey = {}) {
    IKVTolSet_Add(newTol, sKey);
  }
  // The member under the key `vntIndexKey` converted to text (never a position);
  // a key that is not held gives the shared "MISSING" placeholder.
  std::shared_ptr<IKVTolerance> Item(const Variant& vntIndexKey) {
    return IKVTolSet_Item(vntIndexKey);
  }
  Long count() const { return IKVTolSet_count(); }
  // Removes the member under the key; a key that is not held raises the collection's error.
  void Remove(const Variant& vntIndexKey) { IKVTolSet_Remove(vntIndexKey); }
  // The members in insertion order, as a collection of their own (a snapshot).
  std::shared_ptr<Collection> NewEnum() const { return IKVTolSet_NewEnum(); }

 protected:
  virtual Long IKVTolSet_InstTypeID() const = 0;
  virtual void IKVTolSet_InstTypeID(Long value) = 0;
  virtual Variant IKVTolSet_Description() const = 0;
  virtual void IKVTolSet_Description_Let(const Variant& value) = 0;
  virtual void IKVTolSet_Description_Set(const Variant& value) = 0;
  virtual Long IKVTolSet_ID() const = 0;
  virtual void IKVTolSet_ID(Long value) = 0;
  virtual Date IKVTolSet_CreateDate() const = 0;
  virtual void IKVTolSet_CreateDate(Date value) = 0;
  virtual void IKVTolSet_Add(const std::shared_ptr<IKVTolerance>& newTol, const String& sKey) = 0;
  virtual std::shared_ptr<IKVTolerance> IKVTolSet_Item(const Variant& vntIndexKey) = 0;
  virtual Long IKVTolSet_count() const = 0;
  virtual void IKVTolSet_Remove(const Variant& vntIndexKey) = 0;
  virtual std::shared_ptr<Collection> IKVTolSet_NewEnum() const = 0;
};

}  // namespace kvdata
