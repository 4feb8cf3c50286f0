// KVTestRun::StreamIn on a framed stream, with its round trip. The version
// read is kept whatever it is; the record is replaced only when it was read
// whole, and the light-level text only after it. Has2Measurement and
// negative tile counts are normalised on the way back, so encodings are
// compared with each other.

#include "object_target.hpp"

using namespace kvdata;

namespace {

std::shared_ptr<KVTestRun> known_run() {
  auto run = KVTestRun::create();
  tTestRun1 record;
  record.ISN = u"KNOWN";
  record.UserNumber = 5;
  record.IIA.Measurements(1).Tiles.redim(1, 1);
  run->v1TestRun(record);
  run->LightLevelData(u"known light levels");
  return run;
}

fuzz::ObjectStream<KVTestRun> ops() {
  fuzz::ObjectStream<KVTestRun> ops;
  ops.fresh = [] { return KVTestRun::create(); };
  ops.known = known_run;
  ops.after_read = [](const KVTestRun& run, bool, Long, Long) {
    // The light-level spectra never travel: a run read from a stream has
    // them zero, as the known run has.
    for (const tSpectrum& s : run.v1TestRun().LightLevels.LightLevels) {
      for (const Single v : s.Data) KVDATA_FUZZ_CHECK(v == 0.0f, "light-level spectra were read");
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
  static const fuzz::ObjectStream<KVTestRun> kOps = ops();
  return fuzz::object_target(data, size, kOps);
}
