// Streams::Stream_Profile reading a framed stream, with its round trip. The
// Validated byte is not canonical (only 1 reads as True), so the encoding is
// compared with itself, not with the input.

#include "record_target.hpp"

using namespace kvdata;

namespace {

fuzz::RecordStream<tOVProfile> ops() {
  fuzz::RecordStream<tOVProfile> ops;
  ops.read = [](ByteArray& s, Long& p, tOVProfile& r) {
    return Streams::instance().Stream_Profile(eStreamDirection::FromStream, s, p, r);
  };
  ops.write = [](ByteArray& s, Long& p, tOVProfile& r) {
    return Streams::instance().Stream_Profile(eStreamDirection::ToStream, s, p, r);
  };

  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::RecordStream<tOVProfile> kOps = ops();
  return fuzz::record_target(data, size, kOps);
}
