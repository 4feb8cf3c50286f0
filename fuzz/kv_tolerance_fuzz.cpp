// KVTolerance::StreamIn on a framed stream, with its round trip. The
// tolerance is a raw 748-byte image streamed as 749 bytes: a success takes
// exactly those and writes them back unchanged (the 749th as 0); a failure
// leaves the tolerance as it was.

#include "object_target.hpp"

using namespace kvdata;

namespace {

std::shared_ptr<KVTolerance> known_tolerance() {
  auto tol = KVTolerance::create();
  IKVTolerance& t = *tol;
  t.ID(41);
  t.TolName(u"Known");
  t.MaxFail(2.5);
  return tol;
}

fuzz::ObjectStream<KVTolerance> ops() {
  fuzz::ObjectStream<KVTolerance> ops;
  ops.fresh = [] { return KVTolerance::create(); };
  ops.known = known_tolerance;
  ops.whole_or_nothing = true;
  ops.after_read = [](const KVTolerance&, bool ok, Long start, Long end) {
    if (ok)
      KVDATA_FUZZ_CHECK(static_cast<long long>(end) - start == 749,
                        "a tolerance read took other than 749 bytes");
  };
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::ObjectStream<KVTolerance> kOps = ops();
  const int result = fuzz::object_target(data, size, kOps);
  // The record bytes come back as they were read; only the trailing byte is
  // written as 0.
  fuzz::Framed in = fuzz::frame(data, size);
  const Long start = in.position;
  auto tol = KVTolerance::create();
  if (tol->StreamIn(in.stream, in.position)) {
    const std::vector<Byte> out = fuzz::encode(*tol);
    const auto taken = static_cast<std::size_t>(static_cast<long long>(start) - in.stream.lbound());
    KVDATA_FUZZ_CHECK(out.size() == 749 && out[748] == 0,
                      "a tolerance is not written as 749 bytes");
    KVDATA_FUZZ_CHECK(std::memcmp(out.data(), in.stream.data() + taken, 748) == 0,
                      "a tolerance was written back to other bytes");
  }
  return result;
}
