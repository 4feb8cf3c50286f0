#include "kvdata/foundation/test_run1_iterator.hpp"

namespace kvdata {

std::shared_ptr<TestRun1Iterator> TestRun1Iterator::create() {
  return std::shared_ptr<TestRun1Iterator>(new TestRun1Iterator());
}

bool TestRun1Iterator::MoveDirect(const Date& /*TestDate*/) {
  return false;
}

bool TestRun1Iterator::MoveNext() {
  return false;
}

bool TestRun1Iterator::MovePrevious() {
  return false;
}

tTestRun1 TestRun1Iterator::TestRun() const {
  return {};
}

bool TestRun1Iterator::MoveFirst() {
  return false;
}

bool TestRun1Iterator::MoveLast() {
  return false;
}

}  // namespace kvdata
