// The test-run record stream. Its order differs from the record's
// declaration order in two places: the drift before the RMS colour
// difference of each tile, and the IIA tile-set serial number after the
// calibration date. The light-level spectra are not part of it.

#include <cstddef>
#include <limits>
#include <utility>

#include "streams/detail/field_cursor.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/detail/record_streams.hpp"

namespace kvdata::detail {
namespace {

// One IIA tile: Trial and TrialProfiled, both geometries, 40 bands each.
constexpr std::size_t kIiaTileBytes = 2 * 2 * 40 * 4;
static_assert(kIiaTileBytes == 640);

constexpr Long kIntegerMin = std::numeric_limits<Integer>::min();
constexpr Long kIntegerMax = std::numeric_limits<Integer>::max();

void put_stats(FieldWriter& out, const tTestStats& stats) {
  out.put_long(static_cast<Long>(stats.TestResult))
      .put_string(stats.TestExplain)
      .put_date(stats.TestStart)
      .put_date(stats.TestEnd);
}

void get_stats(FieldReader& in, tTestStats& stats) {
  Long result = 0;
  in.get_long(result);
  stats.TestResult = static_cast<eTestResult>(result);
  in.get_string(stats.TestExplain).get_date(stats.TestStart).get_date(stats.TestEnd);
}

// Per geometry and band, the trial value and the profiled value side by side.
void put_iia_tile(FieldWriter& out, const tIIATile& tile) {
  FieldWriter::Run values = out.run(kIiaTileBytes);
  for (Long k = 0; k <= 1; ++k) {
    values.put_interleaved(tile.Trial.Spectrum(k).Data, tile.TrialProfiled.Spectrum(k).Data);
  }
}

void get_iia_tile(FieldReader& in, tIIATile& tile) {
  FieldReader::Run values = in.run(kIiaTileBytes);
  for (Long k = 0; k <= 1; ++k) {
    values.get_interleaved(tile.Trial.Spectrum(k).Data, tile.TrialProfiled.Spectrum(k).Data);
  }
}

Long series_count(const tTUD_IIA& iia) {
  return iia.Has2Measurement ? 2 : 1;
}

// A series can be written when its Tiles has no bounds (written as no tiles)
// or one dimension inside the 16-bit range with at most 32767 tiles.
bool series_writable(const tIIATileSet& series) {
  const auto& tiles = series.Tiles;
  if (!tiles.has_bounds()) return true;
  if (tiles.rank() != 1) return false;
  const Long lower = tiles.lbound();
  const Long upper = tiles.ubound();
  if (lower < kIntegerMin || upper > kIntegerMax) return false;
  return static_cast<long long>(upper) - lower + 1 <= kIntegerMax;
}

}  // namespace

bool write_test_run(const tTestRun1& run, ByteArray& stream, Long& position) {
  const tTUD_IIA& iia = run.IIA;
  for (Long m = 1; m <= series_count(iia); ++m) {
    if (!series_writable(iia.Measurements(m))) return false;
  }

  FieldWriter out(stream, position);
  out.put_string(run.ISN)
      .put_long(run.UserNumber)
      .put_string(run.StationGUID)
      .put_date(run.TestDate)
      .put_string(run.Comment);
  put_stats(out, run.Stats);
  put_stats(out, run.CommunicationsTest);
  put_stats(out, run.LightLevels.Stats);
  const tTUD_Repeatability& rep = run.Repeatability;
  put_stats(out, rep.Stats);
  out.put_spectrum(rep.BlueTileStdDev)
      .put_single(rep.BlueTileMaxdE)
      .put_single(rep.BlueTileDriftdE)
      .put_single(rep.BlueTileRMSdE);
  out.put_spectrum(rep.WhiteTileStdDev)
      .put_single(rep.WhiteTileMaxdE)
      .put_single(rep.WhiteTileDriftdE)
      .put_single(rep.WhiteTileRMSdE);
  put_stats(out, iia.Stats);
  out.put_date(iia.CalStandard).put_string(iia.TSN).put_boolean(iia.Has2Measurement);

  for (Long m = 1; m <= series_count(iia) && out.ok(); ++m) {
    const tIIATileSet& series = iia.Measurements(m);
    out.put_date(series.Profile);
    if (!series.Tiles.has_bounds()) {
      out.put_integer(0);
      continue;
    }
    const Long lower = series.Tiles.lbound();
    const Long upper = series.Tiles.ubound();
    out.put_integer(static_cast<Integer>(upper - lower + 1));
    for (Long i = lower; i <= upper && out.ok(); ++i) put_iia_tile(out, series.Tiles(i));
  }
  return out.ok();
}

bool read_test_run(const ByteArray& stream, Long& position, tTestRun1& run) {
  tTestRun1 fresh;
  FieldReader in(stream, position);
  in.get_string(fresh.ISN)
      .get_long(fresh.UserNumber)
      .get_string(fresh.StationGUID)
      .get_date(fresh.TestDate)
      .get_string(fresh.Comment);
  get_stats(in, fresh.Stats);
  get_stats(in, fresh.CommunicationsTest);
  get_stats(in, fresh.LightLevels.Stats);
  tTUD_Repeatability& rep = fresh.Repeatability;
  get_stats(in, rep.Stats);
  in.get_spectrum(rep.BlueTileStdDev)
      .get_single(rep.BlueTileMaxdE)
      .get_single(rep.BlueTileDriftdE)
      .get_single(rep.BlueTileRMSdE);
  in.get_spectrum(rep.WhiteTileStdDev)
      .get_single(rep.WhiteTileMaxdE)
      .get_single(rep.WhiteTileDriftdE)
      .get_single(rep.WhiteTileRMSdE);
  tTUD_IIA& iia = fresh.IIA;
  get_stats(in, iia.Stats);
  in.get_date(iia.CalStandard).get_string(iia.TSN).get_boolean(iia.Has2Measurement);

  for (Long m = 1; m <= series_count(iia) && in.ok(); ++m) {
    tIIATileSet& series = iia.Measurements(m);
    Integer count = 0;
    in.get_date(series.Profile).get_integer(count);
    if (!in.ok()) return false;
    if (count <= 0) continue;  // a series without tiles has no bounds
    const auto needed = static_cast<std::size_t>(count) * kIiaTileBytes;
    if (needed > bytes_from(stream, position)) return false;
    series.Tiles.redim(1, count);
    for (Long i = 1; i <= count && in.ok(); ++i) get_iia_tile(in, series.Tiles(i));
  }
  if (!in.ok()) return false;

  run = std::move(fresh);
  return true;
}

}  // namespace kvdata::detail
