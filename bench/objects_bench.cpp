// Every object's StreamOut and StreamIn, next to memcpy of the same number of
// bytes. StreamOut writes at Position 0 into an array that the previous
// iteration left at the stream's full length (a caller that streams objects
// repeatedly sees exactly this); StreamIn decodes that stream into one
// object over and over. Figures are bytes per second of stream.

#include <benchmark/benchmark.h>

#include <cstddef>
#include <functional>
#include <memory>
#include <stdexcept>
#include <string>

#include "bench_support.hpp"
#include "kvdata/objects/kv_calibration.hpp"
#include "kvdata/objects/kv_profile.hpp"
#include "kvdata/objects/kv_test_run.hpp"
#include "kvdata/objects/kv_tile_set.hpp"
#include "kvdata/objects/kv_tol_set.hpp"
#include "kvdata/objects/kv_tolerance.hpp"
#include "kvdata/objects/kv_user.hpp"
#include "kvdata/streams/streams.hpp"

namespace kvdata::bench {
namespace {

// Registers StreamOut, StreamIn and memcpy for one object. `make` builds
// the filled object; the stream it writes is what StreamIn reads back.
void register_object(const std::string& name,
                     const std::function<std::shared_ptr<IKVStream>()>& make,
                     const std::function<std::shared_ptr<IKVStream>()>& make_empty) {
  const std::shared_ptr<IKVStream> source = make();
  ByteArray encoded(0, -1);
  Long length = 0;
  if (!source->StreamOut(encoded, length)) throw std::runtime_error(name + ": StreamOut failed");
  const auto bytes = static_cast<std::size_t>(length);
  const std::string base = "objects/" + name + "/";

  benchmark::RegisterBenchmark((base + "StreamOut").c_str(), [=](benchmark::State& state) {
    ByteArray stream = encoded;
    for (auto _ : state) {
      Long position = 0;
      const bool ok = source->StreamOut(stream, position);
      benchmark::DoNotOptimize(stream.data());
      if (!ok || position != length) state.SkipWithError("StreamOut failed");
    }
    set_throughput(state, bytes, 1);
    state.counters["stream_bytes"] = static_cast<double>(bytes);
  });

  benchmark::RegisterBenchmark((base + "StreamIn").c_str(), [=](benchmark::State& state) {
    const std::shared_ptr<IKVStream> target = make_empty();
    for (auto _ : state) {
      Long position = 0;
      const bool ok = target->StreamIn(encoded, position);
      benchmark::ClobberMemory();
      if (!ok || position != length) state.SkipWithError("StreamIn failed");
    }
    set_throughput(state, bytes, 1);
  });

  register_memcpy(base + "memcpy", bytes);
}

String text_of(Lcg& rng, std::size_t length) {
  String text;
  for (std::size_t k = 0; k < length; ++k)
    text.push_back(static_cast<char16_t>(u'a' + rng.next() % 26));
  return text;
}

std::shared_ptr<IKVStream> make_user() {
  tUser user;
  user.USERID = u"jdoe";
  user.UserNumber = 4711;
  user.LastName = u"Doe";
  user.FirstName = u"Jane";
  user.UserPWD = u"secret";
  user.UserMail = u"jane.doe@example.org";
  user.OrgID = 12;
  user.RoleCode = u"A";
  user.Disabled = u"N";
  auto object = KVUser::create();
  object->v1User(user);
  return object;
}

std::shared_ptr<KVTolerance> make_tolerance(Lcg& rng, Long id) {
  auto tol = KVTolerance::create();
  tol->ID(id);
  tol->TolName(text_of(rng, 12));
  tol->Description(text_of(rng, 60));
  tol->MinFail(-2.0);
  tol->MinWarn(-1.0);
  tol->MaxWarn(1.0);
  tol->MaxFail(2.0);
  tol->Misc(text_of(rng, 8));
  return tol;
}

// A tolerance set of 50 members keyed by their IDs.
std::shared_ptr<IKVStream> make_tol_set() {
  Lcg rng(2);
  auto set = KVTolSet::create();
  std::shared_ptr<IKVTolSet> as_set = set;
  as_set->ID(7);
  as_set->InstTypeID(3);
  as_set->CreateDate(Date{45123.5});
  as_set->Description(Variant(String(u"Benchmark tolerances")));
  for (Long id = 1; id <= 50; ++id) {
    const String key = Variant(id).to_string();
    as_set->Add(make_tolerance(rng, id), key);
  }
  return set;
}

tTestStats make_stats(Lcg& rng, Date start) {
  tTestStats stats;
  stats.TestResult = eTestResult::Pass;
  stats.TestExplain = text_of(rng, 20);
  stats.TestStart = start;
  stats.TestEnd = Date{start.days + 0.01};
  return stats;
}

void fill_spectrum(Lcg& rng, tSpectrum& s) {
  for (Single& v : s.Data) v = rng.uniform(0.0f, 100.0f);
}

// A tile set of 13 named tiles with their temperature compensation.
std::shared_ptr<IKVStream> make_tile_set() {
  Lcg rng(4);
  tTileSet record;
  record.TSN = u"TS-0815";
  record.Tiles.redim(1, 13);
  for (tTileDef& tile : record.Tiles) {
    tile.Name = text_of(rng, 16);
    tile.ColorRGB = static_cast<Long>(rng.next() & 0xFFFFFF);
    fill_spectrum(rng, tile.TempComp);
  }
  auto set = KVTileSet::create();
  set->v1TileSet(record);
  return set;
}

// A calibration of 13 tiles, SCE and SCI spectra each.
std::shared_ptr<IKVStream> make_calibration() {
  Lcg rng(5);
  tTileSetCalibration record;
  record.TSN = u"TS-0815";
  record.Certified = Date{45000.5};
  record.TempCalibrated = 23.0f;
  record.Tiles.redim(1, 13);
  for (tSCPair& pair : record.Tiles) {
    for (tSpectrum& s : pair.Spectrum) fill_spectrum(rng, s);
  }
  auto calibration = KVCalibration::create();
  calibration->v1Calibration(record);
  return calibration;
}

// A test run whose inter-instrument-agreement test has two series of
// `tiles` tiles each.
tTestRun1 make_test_run_record(Long tiles) {
  Lcg rng(3);
  tTestRun1 run;
  run.ISN = u"SN-0042-7731";
  run.UserNumber = 4711;
  run.StationGUID = u"{6F9619FF-8B86-D011-B42D-00C04FC964FF}";
  run.TestDate = Date{45123.25};
  run.Comment = u"Monthly check";
  run.Stats = make_stats(rng, run.TestDate);
  run.CommunicationsTest = make_stats(rng, run.TestDate);
  run.LightLevels.Stats = make_stats(rng, run.TestDate);
  for (tSpectrum& s : run.LightLevels.LightLevels) fill_spectrum(rng, s);
  tTUD_Repeatability& rep = run.Repeatability;
  rep.Stats = make_stats(rng, run.TestDate);
  fill_spectrum(rng, rep.BlueTileStdDev);
  fill_spectrum(rng, rep.WhiteTileStdDev);
  rep.BlueTileMaxdE = 0.12f;
  rep.WhiteTileMaxdE = 0.08f;
  run.IIA.Stats = make_stats(rng, run.TestDate);
  run.IIA.TSN = u"TS-0815";
  run.IIA.CalStandard = Date{45000.0};
  run.IIA.Has2Measurement = true;
  for (Long m = 1; m <= 2; ++m) {
    tIIATileSet& series = run.IIA.Measurements(m);
    series.Profile = Date{45100.0 + m};
    series.Tiles.redim(1, tiles);
    for (tIIATile& tile : series.Tiles) {
      for (tSpectrum& s : tile.Trial.Spectrum) fill_spectrum(rng, s);
      for (tSpectrum& s : tile.TrialProfiled.Spectrum) fill_spectrum(rng, s);
    }
  }
  return run;
}

// A test-run object holding a run with two series of `tiles` tiles.
std::shared_ptr<IKVStream> make_test_run(Long tiles) {
  auto run = KVTestRun::create();
  run->v1TestRun(make_test_run_record(tiles));
  run->LightLevelData(u"8 levels, 40 bands, see station log");
  return run;
}

// A profile with every table filled.
std::shared_ptr<IKVStream> make_profile() {
  Lcg rng(6);
  auto profile = KVProfile::create();
  std::shared_ptr<IKVProfile> p = profile;
  p->ISN(u"SN-0042-7731");
  p->Created(Date{45100.0});
  p->Validated(true);
  p->StartWL(360);
  p->EndWl(750);
  p->Interval(10);
  for (const eSC sc : {eSC::SCE, eSC::SCI}) {
    for (Long band = 1; band <= 40; ++band) {
      p->WhiteCorrection(sc, band, rng.uniform(0.9f, 1.1f));
      p->WaveCorrection(sc, band, rng.uniform(-1.0f, 1.0f));
      p->LinearCorrection(sc, band, rng.uniform(0.9f, 1.1f));
      p->DarkCorrection(sc, band, rng.uniform(0.0f, 0.1f));
      p->BandWidthCorrection(sc, band, rng.uniform(9.0f, 11.0f));
    }
  }
  return profile;
}

int register_all() {
  register_object("User", make_user, [] { return KVUser::create(); });
  register_object("TolSet_50", make_tol_set, [] { return KVTolSet::create(); });
  register_object("TileSet_13", make_tile_set, [] { return KVTileSet::create(); });
  register_object("Calibration_13", make_calibration, [] { return KVCalibration::create(); });
  register_object("Profile", make_profile, [] { return KVProfile::create(); });
  register_object(
      "TestRun_2x13", [] { return make_test_run(13); }, [] { return KVTestRun::create(); });
  register_object(
      "TestRun_2x1000", [] { return make_test_run(1000); }, [] { return KVTestRun::create(); });
  return 0;
}

const int registered = register_all();

}  // namespace
}  // namespace kvdata::bench
