#pragma once
// Database operations on users. The database lives in the server: here every
// operation returns its empty result and touches no argument.
//
//   kvdata::tUser user;
//   manager->DBUsers()->Retrieve(kvdata::Long{7}, user);   // False; user unchanged

#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Handed out by DBManager, never created by a client. Holds no state.
class USers : public Object {
 public:
  // For DBManager; a client obtains the facade from its DBManager.
  static std::shared_ptr<USers> create();

  // False.
  bool ExistsUser(const Long& OrgID, const String& USERID);
  // False; `RHS` is not read.
  bool AddNew(const tUser& RHS);
  // False; `RHS` is not read.
  bool Update(const tUser& RHS);
  // False; `User` is left as it was.
  bool Retrieve(const Long& UserNumber, tUser& User);
  // False; `User` is left as it was.
  bool RetrieveOrgUser(const Long& OrgID, const String& USERID, tUser& User);
  // False.
  bool Delete(const Long& OrgID, const String& USERID);
  // An array without bounds.
  Array<tUser> List();

 private:
  USers() = default;
};

}  // namespace kvdata
