#pragma once
// Persistence verbs with a last-error text. The database lives in the server:
// in this library every verb is inert (see InertDBObject).
//
//   kvdata::String id = u"X";
//   obj->Retrieve(id);   // False; id unchanged

#include "kvdata/automation/object.hpp"
#include "kvdata/automation/variant.hpp"

namespace kvdata {

class IKVDBObject : public virtual Object {
 public:
  String ErrMsg() const { return IKVDBObject_ErrMsg(); }
  // `createDate` is optional: null when missing.
  bool Retrieve(String& ID, const Variant* createDate = nullptr) {
    return IKVDBObject_Retrieve(ID, createDate);
  }
  bool AddNew() { return IKVDBObject_AddNew(); }
  bool Update() { return IKVDBObject_Update(); }
  bool Delete() { return IKVDBObject_Delete(); }

 protected:
  virtual String IKVDBObject_ErrMsg() const = 0;
  virtual bool IKVDBObject_Retrieve(String& ID, const Variant* createDate) = 0;
  virtual bool IKVDBObject_AddNew() = 0;
  virtual bool IKVDBObject_Update() = 0;
  virtual bool IKVDBObject_Delete() = 0;
};

// The persistence verbs as this library has them: each returns False at once,
// reads and changes no argument and no state; ErrMsg is always empty.
class InertDBObject : public IKVDBObject {
 protected:
  String IKVDBObject_ErrMsg() const override { return {}; }
  bool IKVDBObject_Retrieve(String&, const Variant*) override { return false; }
  bool IKVDBObject_AddNew() override { return false; }
  bool IKVDBObject_Update() override { return false; }
  bool IKVDBObject_Delete() override { return false; }
};

}  // namespace kvdata
