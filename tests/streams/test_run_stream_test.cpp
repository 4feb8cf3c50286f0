#include <gtest/gtest.h>

#include <vector>

#include "kvdata/kvdata.hpp"
#include "streams/stream_test_support.hpp"

namespace kvdata {
namespace {

using testing::contents;
using testing::LogCapture;
using testing::put;
using testing::sc_pair;
using testing::spectrum;
using testing::Wire;
using Bytes = std::vector<Byte>;

constexpr auto kTo = eStreamDirection::ToStream;
constexpr auto kFrom = eStreamDirection::FromStream;

Streams& streams() {
  return Streams::instance();
}

tTestStats stats(eTestResult result, const String& explain, double start) {
  return tTestStats{result, explain, Date{start}, Date{start + 0.5}};
}

tIIATileSet series(Long tiles, double profile, float base) {
  tIIATileSet s;
  s.Profile = Date{profile};
  if (tiles > 0) s.Tiles.redim(1, tiles);
  for (Long i = 1; i <= tiles; ++i) {
    s.Tiles(i).Trial = sc_pair(base + static_cast<float>(i) * 10);
    s.Tiles(i).TrialProfiled = sc_pair(base + static_cast<float>(i) * 10 + 5000);
  }
  return s;
}

// A test run with a distinct value in every streamed field, and light-level
// spectra (which do not travel).
tTestRun1 test_run(bool two_series) {
  tTestRun1 tr;
  tr.ISN = u"ISN-1";
  tr.UserNumber = 77;
  tr.StationGUID = u"{G}";
  tr.TestDate = Date{45000.0};
  tr.Comment = u"ok";
  tr.Stats = stats(eTestResult::Pass, u"all", 1.0);
  tr.CommunicationsTest = stats(eTestResult::Certified, u"com", 2.0);
  tr.LightLevels.Stats = stats(eTestResult::Fail, u"ll", 3.0);
  for (Long i = 1; i <= 8; ++i) tr.LightLevels.LightLevels(i) = spectrum(static_cast<float>(i));
  tTUD_Repeatability& rep = tr.Repeatability;
  rep.Stats = stats(eTestResult::NA, u"rep", 4.0);
  rep.BlueTileStdDev = spectrum(300);
  rep.BlueTileMaxdE = 1.0f;
  rep.BlueTileRMSdE = 2.0f;
  rep.BlueTileDriftdE = 3.0f;
  rep.WhiteTileStdDev = spectrum(400);
  rep.WhiteTileMaxdE = 4.0f;
  rep.WhiteTileRMSdE = 5.0f;
  rep.WhiteTileDriftdE = 6.0f;
  tr.IIA.Stats = stats(eTestResult::Pass, u"iia", 5.0);
  tr.IIA.TSN = u"TS-9";
  tr.IIA.CalStandard = Date{44000.0};
  tr.IIA.Has2Measurement = two_series;
  tr.IIA.Measurements(1) = series(2, 43000.0, 100);
  if (two_series) tr.IIA.Measurements(2) = series(1, 43001.0, 200);
  return tr;
}

// The expected bytes, value by value in stream order.
Wire expected(const tTestRun1& tr) {
  Wire w;
  auto put_stats = [&](const tTestStats& s) {
    w.l32(static_cast<std::int32_t>(s.TestResult)).str(to_utf8(s.TestExplain));
    w.f64(s.TestStart.days).f64(s.TestEnd.days);
  };
  w.str(to_utf8(tr.ISN)).l32(tr.UserNumber).str(to_utf8(tr.StationGUID)).f64(tr.TestDate.days);
  w.str(to_utf8(tr.Comment));
  put_stats(tr.Stats);
  put_stats(tr.CommunicationsTest);
  put_stats(tr.LightLevels.Stats);
  put_stats(tr.Repeatability.Stats);
  const auto& rep = tr.Repeatability;
  put(w, rep.BlueTileStdDev).f32(rep.BlueTileMaxdE).f32(rep.BlueTileDriftdE).f32(rep.BlueTileRMSdE);
  put(w, rep.WhiteTileStdDev)
      .f32(rep.WhiteTileMaxdE)
      .f32(rep.WhiteTileDriftdE)
      .f32(rep.WhiteTileRMSdE);
  put_stats(tr.IIA.Stats);
  w.f64(tr.IIA.CalStandard.days).str(to_utf8(tr.IIA.TSN)).boolean(tr.IIA.Has2Measurement);
  for (Long m = 1; m <= (tr.IIA.Has2Measurement ? 2 : 1); ++m) {
    const tIIATileSet& s = tr.IIA.Measurements(m);
    w.f64(s.Profile.days).i16(static_cast<std::int16_t>(s.Tiles.has_bounds() ? s.Tiles.size() : 0));
    for (const tIIATile& tile : s.Tiles) {
      for (Long k = 0; k <= 1; ++k) {
        for (Long band = 1; band <= 40; ++band) {
          w.f32(tile.Trial.Spectrum(k).Data(band)).f32(tile.TrialProfiled.Spectrum(k).Data(band));
        }
      }
    }
  }
  return w;
}

TEST(TestRunStream, OneOrTwoSeriesInStreamOrder) {
  for (const bool two : {false, true}) {
    tTestRun1 tr = test_run(two);
    ByteArray stream(0, -1);
    Long pos = 0;
    ASSERT_TRUE(streams().Stream_TestRun(kTo, stream, pos, tr));
    const Wire w = expected(tr);
    EXPECT_EQ(contents(stream), w.bytes);
    EXPECT_EQ(pos, static_cast<Long>(w.size()));

    tTestRun1 back = test_run(!two);  // replaced as a whole (the rest: cut-streams.txt)
    pos = 0;
    ASSERT_TRUE(streams().Stream_TestRun(kFrom, stream, pos, back));
    EXPECT_EQ(back.IIA.Measurements(2).Tiles.has_bounds(), two);
    EXPECT_EQ(back.LightLevels.LightLevels(8), tSpectrum{});
  }
}

TEST(TestRunStream, WriterRefusesSeriesBeyondTheSixteenBitCounter) {
  LogCapture log;
  ByteArray stream(0, -1);
  Long pos = 0;
  tTestRun1 tr = test_run(true);
  tr.IIA.Measurements(2).Tiles.redim(1, 32768);
  EXPECT_FALSE(streams().Stream_TestRun(kTo, stream, pos, tr));
  tr.IIA.Measurements(2).Tiles.redim(40000, 40001);
  EXPECT_FALSE(streams().Stream_TestRun(kTo, stream, pos, tr));
  EXPECT_EQ(stream.ubound(), -1);  // refused before the first byte
  EXPECT_EQ(pos, 0);
  // The second series is not checked when only one travels.
  tr.IIA.Has2Measurement = false;
  EXPECT_TRUE(streams().Stream_TestRun(kTo, stream, pos, tr));
  ByteArray none;
  pos = 0;
  EXPECT_FALSE(streams().Stream_TestRun(kTo, none, pos, tr));
  EXPECT_EQ(log.entries.size(), 1u);
}

}  // namespace
}  // namespace kvdata
