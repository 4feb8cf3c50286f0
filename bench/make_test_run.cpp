// Writes a test-run stream for the command's end-to-end measurements: two
// series of TILES inter-instrument-agreement tiles each (32 767 by default,
// the most a series can hold: about 42 MB), every value distinct.
//
//   make_test_run OUT.kvs [TILES]

#include <cstdio>
#include <cstdlib>
#include <string>

#include "kvdata/objects/kv_test_run.hpp"
#include "kvdata/streams/streams.hpp"

int main(int argc, char** argv) {
  if (argc < 2 || argc > 3) {
    std::fprintf(stderr, "usage: make_test_run OUT.kvs [TILES]\n");
    return 2;
  }
  const long tiles = argc == 3 ? std::strtol(argv[2], nullptr, 10) : 32767;
  if (tiles < 1 || tiles > 32767) {
    std::fprintf(stderr, "make_test_run: TILES must be 1 to 32767\n");
    return 2;
  }
  using namespace kvdata;
  tTestRun1 record;
  record.ISN = u"BENCH-42";
  record.IIA.Has2Measurement = true;
  float v = 0.0f;
  for (Long m = 1; m <= 2; ++m) {
    tIIATileSet& series = record.IIA.Measurements(m);
    series.Tiles.redim(1, static_cast<Long>(tiles));
    for (tIIATile& tile : series.Tiles) {
      for (tSCPair* pair : {&tile.Trial, &tile.TrialProfiled}) {
        for (tSpectrum& s : pair->Spectrum) {
          for (Single& x : s.Data) x = (v += 0.001f);
        }
      }
    }
  }
  auto run = KVTestRun::create();
  run->v1TestRun(record);
  ByteArray bytes(0, -1);
  Long pos = 0;
  if (!run->StreamOut(bytes, pos)) {
    std::fprintf(stderr, "make_test_run: the test run could not be written\n");
    return 1;
  }
  // The whole array, as `kvdata encode` writes it: the spare byte the
  // writer leaves after the encoding included.
  std::FILE* out = std::fopen(argv[1], "wb");
  if (out == nullptr || std::fwrite(bytes.data(), 1, bytes.size(), out) != bytes.size() ||
      std::fclose(out) != 0) {
    std::fprintf(stderr, "make_test_run: cannot write %s\n", argv[1]);
    return 1;
  }
  return 0;
}
