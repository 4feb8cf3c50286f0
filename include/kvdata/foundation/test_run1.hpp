#pragma once
// Database operations on test runs. The database lives in the server: here
// every operation returns its empty result and touches no argument.
//
//   kvdata::tTestRun1 run;
//   manager->DBTestRuns()->GetLastTRDate(u"ISN1");   // the zero date, 1899-12-30

#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/foundation/records.hpp"
#include "kvdata/foundation/test_run1_iterator.hpp"

namespace kvdata {

// Handed out by DBManager, never created by a client. Holds no state.
class TestRun1 : public Object {
 public:
  // For DBManager; a client obtains the facade from its DBManager.
  static std::shared_ptr<TestRun1> create();

  // False; `RHS` is not read.
  bool AddNew(const tTestRun1& RHS);
  // False; `TestRun` is left as it was.
  bool Retrieve(const String& ISN, const Date& TestDate, tTestRun1& TestRun);
  // False; `TestRun` is left as it was.
  bool RetrieveByID(const Long& TRID, tTestRun1& TestRun);
  // False.
  bool Delete(const String& ISN, const Date& TestDate);
  // An array without bounds.
  Array<String> ListAvailableIntruments();
  // An array without bounds.
  Array<Date> ListTestRuns(const String& ISN);
  // The zero date (1899-12-30 00:00).
  Date GetLastTRDate(const String& ISN);
  // No object (null).
  std::shared_ptr<TestRun1Iterator> GetIterator(const String& ISN, const bool& MoveLast = false,
                                                const String& TSN = {}, const String& USERID = {},
                                                const String& StationGUID = {});
  // The zero date (1899-12-30 00:00).
  Date GetFirstTRDate(const String& ISN);

 private:
  TestRun1() = default;
};

}  // namespace kvdata
