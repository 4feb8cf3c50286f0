// Streams::Stream_Organization reading a framed stream, with its round trip.

#include "record_target.hpp"

using namespace kvdata;

namespace {

fuzz::RecordStream<tOrganization> ops() {
  fuzz::RecordStream<tOrganization> ops;
  ops.read = [](ByteArray& s, Long& p, tOrganization& r) {
    return Streams::instance().Stream_Organization(eStreamDirection::FromStream, s, p, r);
  };
  ops.write = [](ByteArray& s, Long& p, tOrganization& r) {
    return Streams::instance().Stream_Organization(eStreamDirection::ToStream, s, p, r);
  };
  ops.block_bytes = 133;
  ops.whole_or_nothing = true;
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::RecordStream<tOrganization> kOps = ops();
  return fuzz::record_target(data, size, kOps);
}
