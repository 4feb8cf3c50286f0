#pragma once
// Database operations on calibration standards: tile sets and their
// calibrations. The database lives in the server: here every operation
// returns its empty result and touches no argument.
//
//   kvdata::tTileSetCalibration cal;
//   manager->DBCalStandards()->RetrieveCalibration(u"TS0001", cal);   // False; cal unchanged

#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Handed out by DBManager, never created by a client. Holds no state.
class CalStandards : public Object {
 public:
  // For DBManager; a client obtains the facade from its DBManager.
  static std::shared_ptr<CalStandards> create();

  // False.
  bool ExistsTileSet(const String& TSN);
  // False.
  bool ExistsCalibration(const String& TSN, const Date& Certified);
  // False; `RHS` is not read.
  bool AddNewTileSet(const tTileSet& RHS);
  // False; `RHS` is left as it was.
  bool RetrieveTileSet(const String& TSN, tTileSet& RHS);
  // False.
  bool DeleteTileSet(const String& TSN);
  // An array without bounds.
  Array<tTSListInfo> ListTileSets();
  // False; `RHS` is not read.
  bool AddNewCalibration(const tTileSetCalibration& RHS);
  // False; `RHS` is left as it was. `DateCertified` is optional (null when missing).
  bool RetrieveCalibration(const String& TSN, tTileSetCalibration& RHS,
                           const Variant* DateCertified = nullptr);
  // False.
  bool DeleteCalibration(const String& TSN, const Date& Certified);
  // An array without bounds.
  Array<Date> ListCalibrations(const String& TSN);

 private:
  CalStandards() = default;
};

}  // namespace kvdata
