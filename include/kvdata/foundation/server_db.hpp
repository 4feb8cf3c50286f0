#pragma once
// Operations on the server's own tables (operation log, instrument owners).
// The database lives in the server: here every operation returns False and
// touches no argument.
//
//   kvdata::Array<kvdata::String> isns;
//   manager->DBServerDB()->GetUserISNs(kvdata::Long{7}, isns);   // False; isns unchanged

#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata {

// Handed out by DBManager, never created by a client. Holds no state.
class ServerDB : public Object {
 public:
  // For DBManager; a client obtains the facade from its DBManager.
  static std::shared_ptr<ServerDB> create();

  // False; nothing is logged.
  bool AddNewServerOpLog(const String& NetClientAddress, const String& ClientVersion,
                         const Date& Opdate, const String& OpISN, const String& OpTSN,
                         const Long& OpDuration, const bool& OpSuccess, const String& OpLog);
  // False; `ISNs` is left as it was (bounds and elements).
  bool GetUserISNs(const Long& USERID, Array<String>& ISNs);

 private:
  ServerDB() = default;
};

}  // namespace kvdata
