// A station application in miniature: it fills a test run, streams it out,
// saves the stream to a file, loads it again, streams it into a new test run
// object and checks that everything the stream carries came back.
//
//   testrun_client [FILE]        (default testrun.kvs in the current folder)
#include <kvdata/kvdata.hpp>

#include <cstdio>
#include <string>

namespace {

using namespace kvdata;

tSpectrum spectrum(float base, float slope) {
  tSpectrum s;
  for (Long band = 1; band <= 40; ++band) s.Data(band) = base + slope * static_cast<float>(band);
  return s;
}

tTestStats stats(eTestResult result, const char16_t* explain, double start, double end) {
  tTestStats s;
  s.TestResult = result;
  s.TestExplain = explain;
  s.TestStart = Date{start};
  s.TestEnd = Date{end};
  return s;
}

// One inter-instrument-agreement series: `tiles` tiles measured and profiled.
tIIATileSet series(Long tiles, float offset) {
  tIIATileSet set;
  set.Profile = Date{45327.38379};
  set.Tiles.redim(1, tiles);
  for (Long t = 1; t <= tiles; ++t) {
    const float base = 5.0f * static_cast<float>(t);
    set.Tiles(t).Trial.Spectrum(eSC::SCE) = spectrum(base + offset, 0.5f);
    set.Tiles(t).Trial.Spectrum(eSC::SCI) = spectrum(base + offset + 4.0f, 0.5f);
    set.Tiles(t).TrialProfiled.Spectrum(eSC::SCE) = spectrum(base, 0.5f);
    set.Tiles(t).TrialProfiled.Spectrum(eSC::SCI) = spectrum(base + 4.0f, 0.5f);
  }
  return set;
}

tTestRun1 make_test_run() {
  tTestRun1 run;
  run.ISN = u"SP64-20931";
  run.UserNumber = 1042;
  run.StationGUID = u"{3F2504E0-4F89-11D3-9A0C-0305E82C3301}";
  run.TestDate = Date{45366.4375};  // 2024-03-15 10:30
  run.Comment = u"Quarterly check after lamp change";
  run.Stats = stats(eTestResult::Pass, u"All tests within tolerance", 45366.4375, 45366.46);
  run.CommunicationsTest = stats(eTestResult::Pass, u"Instrument answered", 45366.4375, 45366.4376);
  run.LightLevels.Stats = stats(eTestResult::Pass, u"Lamp output within limits", 45366.44, 45366.442);
  run.Repeatability.Stats = stats(eTestResult::Pass, u"20 readings of each tile", 45366.443, 45366.45);
  run.Repeatability.BlueTileStdDev = spectrum(0.02f, 0.0005f);
  run.Repeatability.BlueTileMaxdE = 0.061f;
  run.Repeatability.BlueTileRMSdE = 0.027f;
  run.Repeatability.BlueTileDriftdE = 0.018f;
  run.Repeatability.WhiteTileStdDev = spectrum(0.015f, 0.0003f);
  run.Repeatability.WhiteTileMaxdE = 0.043f;
  run.Repeatability.WhiteTileRMSdE = 0.019f;
  run.Repeatability.WhiteTileDriftdE = 0.011f;
  run.IIA.Stats = stats(eTestResult::Pass, u"Average dE*ab 0.21", 45366.45, 45366.46);
  run.IIA.TSN = u"CT-4471";
  run.IIA.CalStandard = Date{45313.0};
  run.IIA.Measurements(1) = series(13, 0.3f);
  run.IIA.Measurements(2) = series(13, -0.2f);
  run.IIA.Has2Measurement = true;
  return run;
}

int fail(const char* what) {
  std::fprintf(stderr, "testrun_client: %s\n", what);
  return 1;
}

}  // namespace

int main(int argc, char** argv) {
  const String file = from_utf8(argc > 1 ? argv[1] : "testrun.kvs");
  const tTestRun1 run = make_test_run();
  const String light_levels = u"LL1=98.2;LL2=97.9;LL3=98.4;LL4=98.1;LL5=97.6;LL6=98.0;LL7=98.3;LL8=97.8";

  // Fill a test run and stream it out.
  auto test_run = KVTestRun::create();
  test_run->v1TestRun(run);
  test_run->LightLevelData(light_levels);
  ByteArray bytes(0, -1);
  Long position = 0;
  if (!test_run->StreamOut(bytes, position)) return fail("StreamOut failed");
  std::printf("streamed out: %d bytes (StreamLen %d)\n", position, test_run->StreamLen());

  // Save the stream to a file and load it back.
  Streams& streams = Streams::instance();
  if (!streams.StreamSave(file, bytes)) return fail("StreamSave failed");
  ByteArray loaded;
  if (!streams.StreamLoad(file, loaded)) return fail("StreamLoad failed");
  std::printf("saved and loaded %s: indices %d..%d\n", to_utf8(file).c_str(), loaded.lbound(),
              loaded.ubound());

  // A loaded stream starts at index 1: read it from there into a new object.
  auto read_back = KVTestRun::create();
  Long at = loaded.lbound();
  if (!read_back->StreamIn(loaded, at)) return fail("StreamIn failed");
  const tTestRun1 back = read_back->v1TestRun();

  // The light-level spectra are not part of the stream; everything else is.
  tTestRun1 expected = run;
  expected.LightLevels.LightLevels = {};
  if (!(back == expected)) return fail("the test run read back differs from the one written");

  const tIIATileSet& second = back.IIA.Measurements(2);
  std::printf("read back: %s, user %d, %s, %s series, %zu tiles in series 2, SCI band 40 of tile 13 "
              "%.2f\n",
              to_utf8(back.ISN).c_str(), back.UserNumber, to_utf8(back.Comment).c_str(),
              back.IIA.Has2Measurement ? "two" : "one", second.Tiles.size(),
              static_cast<double>(second.Tiles(13).Trial.Spectrum(eSC::SCI).Data(40)));
  std::puts("testrun_client: the test run came back unchanged");

  // A tolerance set: on the set, ID and Description are the set's own; its
  // identity as a domain object is reached through IKVObj.
  auto tolerance = KVTolerance::create();
  tolerance->ID(12);
  tolerance->TolName(u"dE*ab white");
  tolerance->MaxFail(0.5);
  auto tol_set = KVTolSet::create();
  tol_set->ID(7);
  tol_set->Description(u"Bench spectrophotometers");
  tol_set->Add(tolerance, u"12");
  std::printf("tolerance set %d (%s, %s): %s fails above %.2f\n", tol_set->ID(),
              to_utf8(tol_set->Description().to_string()).c_str(),
              to_utf8(query<IKVObj>(tol_set)->Description()).c_str(),
              to_utf8(tol_set->Item(Long{12})->TolName()).c_str(),
              tol_set->Item(Long{12})->MaxFail());
  return 0;
}
