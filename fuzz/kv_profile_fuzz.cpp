// KVProfile::StreamIn on a framed stream, with its round trip. Only the
// stamp 1.4 is a profile stream: any other leaves the profile unchanged with
// Position just past the stamp. A success takes 1649 bytes plus the text of
// ISN; the Validated byte is normalised on the way back, so encodings are
// compared with each other.

#include "object_target.hpp"

using namespace kvdata;

namespace {

std::shared_ptr<KVProfile> known_profile() {
  auto profile = KVProfile::create();
  IKVProfile& p = *profile;
  p.ISN(u"KNOWN");
  p.StartWL(380);
  p.WhiteCorrection(eSC::SCI, 40, 1.25f);
  p.BandWidthCorrection(eSC::SCE, 1, 0.5f);
  return profile;
}

fuzz::ObjectStream<KVProfile> ops() {
  fuzz::ObjectStream<KVProfile> ops;
  ops.fresh = [] { return KVProfile::create(); };
  ops.known = known_profile;
  ops.after_read = [](const KVProfile& profile, bool ok, Long start, Long end) {
    const long long moved = static_cast<long long>(end) - start;
    const IKVProfile& p = profile;
    if (ok) {
      const long long isn_bytes = static_cast<long long>(ansi::encode(p.ISN()).size());
      KVDATA_FUZZ_CHECK(moved == 1649 + isn_bytes, "a profile read took other than its bytes");
    } else if (moved <= 4) {
      // Refused at the stamp, or at the first Long after it: nothing may
      // have changed.
      KVDATA_FUZZ_CHECK(p.ISN() == u"KNOWN" && p.StartWL() == 380,
                        "a refused profile stream changed the profile");
    }
  };
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::ObjectStream<KVProfile> kOps = ops();
  return fuzz::object_target(data, size, kOps);
}
