// KVCalibration::StreamIn on a framed stream, with its round trip. The
// calibration is a raw 4188-byte image (TSN units as stored, date,
// temperature, 13 pairs of spectra): a success takes exactly those bytes and
// writes them back unchanged; a failure leaves the calibration as it was.

#include "object_target.hpp"

using namespace kvdata;

namespace {

std::shared_ptr<KVCalibration> known_calibration() {
  auto cal = KVCalibration::create();
  IKVCalibration& c = *cal;
  c.TSN(u"KNOWN");
  c.DateCertified(Date{45000.5});
  c.TempCalibrated(23.0f);
  return cal;
}

fuzz::ObjectStream<KVCalibration> ops() {
  fuzz::ObjectStream<KVCalibration> ops;
  ops.fresh = [] { return KVCalibration::create(); };
  ops.known = known_calibration;
  ops.whole_or_nothing = true;
  ops.canonical = true;
  ops.after_read = [](const KVCalibration&, bool ok, Long start, Long end) {
    if (ok)
      KVDATA_FUZZ_CHECK(static_cast<long long>(end) - start == 4188,
                        "a calibration read took other than 4188 bytes");
  };
  return ops;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  fuzz::quiet_event_log();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::ObjectStream<KVCalibration> kOps = ops();
  return fuzz::object_target(data, size, kOps);
}
