#pragma once
// Database operations on measuring stations. The database lives in the
// server: here every operation returns its empty result and touches no argument.
//
//   kvdata::tStation station;
//   manager->DBStations()->Retrieve(guid, station);   // False; station unchanged

#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Handed out by DBManager, never created by a client. Holds no state.
class Stations : public Object {
 public:
  // For DBManager; a client obtains the facade from its DBManager.
  static std::shared_ptr<Stations> create();

  // False; `RHS` is not read.
  bool AddNew(const tStation& RHS);
  // False; `RHS` is not read.
  bool Update(const tStation& RHS);
  // False; `Station` is left as it was.
  bool Retrieve(const String& StationGUID, tStation& Station);
  // False.
  bool Delete(const String& StationGUID);
  // An array without bounds.
  Array<tStation> List();

 private:
  Stations() = default;
};

}  // namespace kvdata
