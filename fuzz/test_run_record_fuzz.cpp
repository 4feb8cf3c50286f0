// Streams::Stream_TestRun reading a framed stream, with its round trip. The
// record is replaced only as a whole; Has2Measurement and negative tile counts
// are normalised on the way back, so encodings are compared with each other.

#include "record_target.hpp"

using namespace kvdata;

namespace {

fuzz::RecordStream<tTestRun1> ops() {
  fuzz::RecordStream<tTestRun1> ops;
  ops.read = [](ByteArray& s, Long& p, tTestRun1& r) {
    return Streams::instance().Stream_TestRun(eStreamDirection::FromStream, s, p, r);
  };
  ops.write = [](ByteArray& s, Long& p, tTestRun1& r) {
    return Streams::instance().Stream_TestRun(eStreamDirection::ToStream, s, p, r);
  };
  ops.whole_or_nothing = true;
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::RecordStream<tTestRun1> kOps = ops();
  return fuzz::record_target(data, size, kOps);
}
