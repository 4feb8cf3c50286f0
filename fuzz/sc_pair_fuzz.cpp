// Streams::Stream_SCPair reading a framed stream, with its round trip.

#include "record_target.hpp"

using namespace kvdata;

namespace {

fuzz::RecordStream<tSCPair> ops() {
  fuzz::RecordStream<tSCPair> ops;
  ops.read = [](ByteArray& s, Long& p, tSCPair& r) {
    return Streams::instance().Stream_SCPair(eStreamDirection::FromStream, s, p, r);
  };
  ops.write = [](ByteArray& s, Long& p, tSCPair& r) {
    return Streams::instance().Stream_SCPair(eStreamDirection::ToStream, s, p, r);
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
  static const fuzz::RecordStream<tSCPair> kOps = ops();
  return fuzz::record_target(data, size, kOps);
}
