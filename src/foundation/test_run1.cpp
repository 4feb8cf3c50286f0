#include "kvdata/foundation/test_run1.hpp"

namespace kvdata {

std::shared_ptr<TestRun1> TestRun1::create() {
  return std::shared_ptr<TestRun1>(new TestRun1());
}

bool TestRun1::AddNew(const tTestRun1& /*RHS*/) {
  return false;
}

bool TestRun1::Retrieve(const String& /*ISN*/, const Date& /*TestDate*/, tTestRun1& /*TestRun*/) {
  return false;
}

bool TestRun1::RetrieveByID(const Long& /*TRID*/, tTestRun1& /*TestRun*/) {
  return false;
}

bool TestRun1::Delete(const String& /*ISN*/, const Date& /*TestDate*/) {
  return false;
}

Array<String> TestRun1::ListAvailableIntruments() {
  return {};
}

Array<Date> TestRun1::ListTestRuns(const String& /*ISN*/) {
  return {};
}

Date TestRun1::GetLastTRDate(const String& /*ISN*/) {
  return {};
}

std::shared_ptr<TestRun1Iterator> TestRun1::GetIterator(const String& /*ISN*/,
                                                        const bool& /*MoveLast*/,
                                                        const String& /*TSN*/,
                                                        const String& /*USERID*/,
                                                        const String& /*StationGUID*/) {
  return nullptr;
}

Date TestRun1::GetFirstTRDate(const String& /*ISN*/) {
  return {};
}

}  // namespace kvdata
