#pragma once
// Database operations on organisations. The database lives in the server:
// here every operation returns its empty result and touches no argument.
//
//   kvdata::tOrganization org;
//   manager->DBOrganizations()->Retrieve(u"HQ", org);   // False; org unchanged

#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Handed out by DBManager, never created by a client. Holds no state.
class Organizations : public Object {
 public:
  // For DBManager; a client obtains the facade from its DBManager.
  static std::shared_ptr<Organizations> create();

  // False; `Org` is not read.
  bool Update(const tOrganization& Org);
  // False; `Org` is left as it was.
  bool Retrieve(const String& OrgAlias, tOrganization& Org);
  // An array without bounds.
  Array<tOrganization> List();
  // False.
  bool Delete(const String& OrgAlias);
  // False; `Org` is not read.
  bool AddNew(const tOrganization& Org);

 private:
  Organizations() = default;
};

}  // namespace kvdata
