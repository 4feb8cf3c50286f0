#pragma once
// Database operations on instrument profiles. The database lives in the
// server: here every operation returns its empty result and touches no argument.
//
//   kvdata::tOVProfile profile;
//   manager->DBProfiles()->RetrieveLatest(u"ISN1", profile);   // False; profile unchanged

#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Handed out by DBManager, never created by a client. Holds no state.
class Profiles : public Object {
 public:
  // For DBManager; a client obtains the facade from its DBManager.
  static std::shared_ptr<Profiles> create();

  // False. `Created` and `Validated` are optional (null when missing).
  bool ExistsProfile(const String& ISN, const Variant* Created = nullptr,
                     const Variant* Validated = nullptr);
  // False; `RHS` is not read.
  bool AddNew(const tOVProfile& RHS);
  // False; `RHS` is left as it was.
  bool Retrieve(const String& ISN, const Date& DateCreated, tOVProfile& RHS);
  // False; `RHS` is left as it was.
  bool RetrieveLatest(const String& ISN, tOVProfile& RHS);
  // False.
  bool Delete(const String& ISN, const Date& Created);
  // An array without bounds.
  Array<String> ListAvailableProfiles();
  // An array without bounds.
  Array<Date> ListInstrumentProfiles(const String& ISN, const bool& Validated = true);

 private:
  Profiles() = default;
};

}  // namespace kvdata
