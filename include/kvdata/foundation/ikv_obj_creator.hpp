#pragma once
// Creation of a domain object from its type word (implemented by DBManager).
//
//   auto set = manager->Create(u"TolSet");   // the manager's shared tolerance set

#include <memory>

#include "kvdata/foundation/ikv_obj.hpp"

namespace kvdata {

class IKVObjCreator : public virtual Object {
 public:
  // The object for `ObjectType`, or no object (null) for a word that is not known.
  // The caller's text is not changed.
  std::shared_ptr<IKVObj> Create(const String& ObjectType) {
    return IKVObjCreator_Create(ObjectType);
  }

 protected:
  virtual std::shared_ptr<IKVObj> IKVObjCreator_Create(const String& ObjectType) = 0;
};

}  // namespace kvdata
