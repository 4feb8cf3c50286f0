// Writes the largest test run a stream can carry: a KVTestRun whose IIA
// holds two series of 32767 tiles each (about 42 MB), for measuring what the
// kvdata command needs to show it (scripts/explain-memory.sh).
//
//   kvdata_large_test_run big.kvs

#include <cstdio>
#include <limits>

#include "kvdata/kvdata.hpp"

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: kvdata_large_test_run OUT.kvs\n");
    return 2;
  }
  constexpr kvdata::Long kTiles = std::numeric_limits<kvdata::Integer>::max();
  auto run = kvdata::KVTestRun::create();
  kvdata::tTestRun1 record = run->v1TestRun();
  record.ISN = u"SP64-LARGE";
  record.IIA.Has2Measurement = true;
  for (kvdata::Long m = 1; m <= 2; ++m) {
    auto& tiles = record.IIA.Measurements(m).Tiles;
    tiles.redim(1, kTiles);
    for (kvdata::Long t = 1; t <= kTiles; ++t) {
      for (kvdata::Long band = 1; band <= kvdata::kBandCount; ++band) {
        const auto v =
            static_cast<kvdata::Single>(t % 100) + static_cast<kvdata::Single>(band) / 64;
        tiles(t).Trial.Spectrum(kvdata::eSC::SCE).Data(band) = v;
        tiles(t).TrialProfiled.Spectrum(kvdata::eSC::SCI).Data(band) = v / 2;
      }
    }
  }
  run->v1TestRun(record);
  kvdata::ByteArray bytes(0, -1);
  kvdata::Long pos = 0;
  if (!run->StreamOut(bytes, pos) ||
      !kvdata::Streams::instance().StreamSave(
          kvdata::String(argv[1], argv[1] + std::char_traits<char>::length(argv[1])), bytes)) {
    std::fprintf(stderr, "kvdata_large_test_run: could not write %s\n", argv[1]);
    return 1;
  }
  return 0;
}
