#pragma once
// Identity of a domain object: its type word, a readable kind and the values
// that identify it.
//
//   auto obj = kvdata::query<kvdata::IKVObj>(tol_set);
//   obj->ObjType() == u"TolSet";  obj->ID();   // the set's InstTypeID

#include "kvdata/automation/object.hpp"
#include "kvdata/automation/variant.hpp"

namespace kvdata {

// Members are reached by their type-library names; a class implements the
// protected IKVObj_ members, so that members of other interfaces with the
// same name (IKVTolSet's ID) stay apart.
class IKVObj : public virtual Object {
 public:
  // The class's type word, the one DBManager's Create takes where it creates the class.
  String ObjType() const { return IKVObj_ObjType(); }
  // A readable name of the kind of object.
  String Description() const { return IKVObj_Description(); }
  // The identifying value, read from the object's current fields (Empty for some classes).
  Variant ID() const { return IKVObj_ID(); }
  // The creation or certification date, read from the current fields, or Empty.
  Variant DateCreated() const { return IKVObj_DateCreated(); }

 protected:
  virtual String IKVObj_ObjType() const = 0;
  virtual String IKVObj_Description() const = 0;
  virtual Variant IKVObj_ID() const = 0;
  virtual Variant IKVObj_DateCreated() const = 0;
};

}  // namespace kvdata
