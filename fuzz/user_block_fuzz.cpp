// Streams::Stream_User reading a framed stream, with its round trip. Texts
// lose their blanks when read, so encodings are compared with each other.

#include "record_target.hpp"

using namespace kvdata;

namespace {

fuzz::RecordStream<tUser> ops() {
  fuzz::RecordStream<tUser> ops;
  ops.read = [](ByteArray& s, Long& p, tUser& r) {
    return Streams::instance().Stream_User(eStreamDirection::FromStream, s, p, r);
  };
  ops.write = [](ByteArray& s, Long& p, tUser& r) {
    return Streams::instance().Stream_User(eStreamDirection::ToStream, s, p, r);
  };
  ops.block_bytes = 261;
  ops.whole_or_nothing = true;
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::RecordStream<tUser> kOps = ops();
  return fuzz::record_target(data, size, kOps);
}
