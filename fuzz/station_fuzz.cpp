// Streams::Stream_Station reading a framed stream, with its round trip.

#include "record_target.hpp"

using namespace kvdata;

namespace {

fuzz::RecordStream<tStation> ops() {
  fuzz::RecordStream<tStation> ops;
  ops.read = [](ByteArray& s, Long& p, tStation& r) {
    return Streams::instance().Stream_Station(eStreamDirection::FromStream, s, p, r);
  };
  ops.write = [](ByteArray& s, Long& p, tStation& r) {
    return Streams::instance().Stream_Station(eStreamDirection::ToStream, s, p, r);
  };
  ops.canonical = true;
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::RecordStream<tStation> kOps = ops();
  return fuzz::record_target(data, size, kOps);
}
