#pragma once
// A cursor over the test runs of one instrument. No cursor is handed out in
// this library (TestRun1::GetIterator gives no object); every move is False
// and the current run is an empty record.
//
//   auto it = manager->DBTestRuns()->GetIterator(u"ISN1");   // null
//   if (it && it->MoveFirst()) use(it->TestRun());

#include <memory>

#include "kvdata/automation/object.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Never created by a client. Holds no state.
class TestRun1Iterator : public Object {
 public:
  // For the library only; a client never receives a cursor.
  static std::shared_ptr<TestRun1Iterator> create();

  // False.
  bool MoveDirect(const Date& TestDate);
  // False.
  bool MoveNext();
  // False.
  bool MovePrevious();
  // A fresh record: every text empty, every number, date and spectrum value 0.
  tTestRun1 TestRun() const;
  // False.
  bool MoveFirst();
  // False.
  bool MoveLast();

 private:
  TestRun1Iterator() = default;
};

}  // namespace kvdata
