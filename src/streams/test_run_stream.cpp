// The test-run record stream. Its order differs from the record's
// declaration order in two places: the drift before the RMS colour
// difference of each tile, and the IIA tile-set serial number after the
// calibration date. The light-level spectra are not part of it.

#include <cstddef>
#include <limits>
#include <string>
#include <string_view>
#include <utility>

#include "kvdata/foundation/record_fields.hpp"
#include "streams/detail/field_cursor.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/detail/observe.hpp"
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

void get_stats(FieldReader& in, std::string_view name, tTestStats& stats) {
  const ObservedRecord record(in.observer(), name);
  Long result = 0;
  in.get_long(result, field_name<&tTestStats::TestResult>());
  stats.TestResult = static_cast<eTestResult>(result);
  in.get<&tTestStats::TestExplain>(stats)
      .get<&tTestStats::TestStart>(stats)
      .get<&tTestStats::TestEnd>(stats);
}

// Per geometry and band, the trial value and the profiled value side by side.
void put_iia_tile(FieldWriter& out, const tIIATile& tile) {
  FieldWriter::Run values = out.run(kIiaTileBytes);
  for (Long k = 0; k <= 1; ++k) {
    values.put_interleaved(tile.Trial.Spectrum(k).Data, tile.TrialProfiled.Spectrum(k).Data);
  }
}

// Where the values of an IIA tile's spectra go, by geometry: Trial.SCE(band), ...
constexpr FieldReader::Slot kTrialSlots[] = {
    {field_name<&tIIATile::Trial>(), FieldReader::sc_name(eSC::SCE)},
    {field_name<&tIIATile::Trial>(), FieldReader::sc_name(eSC::SCI)}};
constexpr FieldReader::Slot kProfiledSlots[] = {
    {field_name<&tIIATile::TrialProfiled>(), FieldReader::sc_name(eSC::SCE)},
    {field_name<&tIIATile::TrialProfiled>(), FieldReader::sc_name(eSC::SCI)}};

void get_iia_tile(FieldReader& in, tIIATile& tile) {
  FieldReader::Run values = in.run(kIiaTileBytes);
  for (Long k = 0; k <= 1; ++k) {
    values.get_interleaved(tile.Trial.Spectrum(k).Data, tile.TrialProfiled.Spectrum(k).Data,
                           kTrialSlots[k], kProfiledSlots[k]);
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
  StreamObserver* const observer = in.observer();
  const ObservedRecord tr(observer, kTestRunArgument);
  in.get<&tTestRun1::ISN>(fresh)
      .get<&tTestRun1::UserNumber>(fresh)
      .get<&tTestRun1::StationGUID>(fresh)
      .get<&tTestRun1::TestDate>(fresh)
      .get<&tTestRun1::Comment>(fresh);
  get_stats(in, field_name<&tTestRun1::Stats>(), fresh.Stats);
  get_stats(in, field_name<&tTestRun1::CommunicationsTest>(), fresh.CommunicationsTest);
  {
    const ObservedRecord light(observer, field_name<&tTestRun1::LightLevels>());
    get_stats(in, field_name<&tTUD_LightLevels::Stats>(), fresh.LightLevels.Stats);
  }
  {
    tTUD_Repeatability& rep = fresh.Repeatability;
    const ObservedRecord repeatability(observer, field_name<&tTestRun1::Repeatability>());
    get_stats(in, field_name<&tTUD_Repeatability::Stats>(), rep.Stats);
    in.get<&tTUD_Repeatability::BlueTileStdDev>(rep)
        .get<&tTUD_Repeatability::BlueTileMaxdE>(rep)
        .get<&tTUD_Repeatability::BlueTileDriftdE>(rep)
        .get<&tTUD_Repeatability::BlueTileRMSdE>(rep);
    in.get<&tTUD_Repeatability::WhiteTileStdDev>(rep)
        .get<&tTUD_Repeatability::WhiteTileMaxdE>(rep)
        .get<&tTUD_Repeatability::WhiteTileDriftdE>(rep)
        .get<&tTUD_Repeatability::WhiteTileRMSdE>(rep);
  }
  tTUD_IIA& iia = fresh.IIA;
  const ObservedRecord iia_record(observer, field_name<&tTestRun1::IIA>());
  get_stats(in, field_name<&tTUD_IIA::Stats>(), iia.Stats);
  in.get<&tTUD_IIA::CalStandard>(iia).get<&tTUD_IIA::TSN>(iia).get<&tTUD_IIA::Has2Measurement>(iia);

  for (Long m = 1; m <= series_count(iia) && in.ok(); ++m) {
    tIIATileSet& series = iia.Measurements(m);
    const ObservedRecord measurement(observer, field_name<&tTUD_IIA::Measurements>(), m);
    Integer count = 0;
    in.get<&tIIATileSet::Profile>(series);
    const Long count_at = in.position();
    in.get_integer(count, stream_names::kTileCount);
    if (!in.ok()) return false;
    if (count <= 0) continue;  // a series without tiles has no bounds
    const auto needed = static_cast<std::size_t>(count) * kIiaTileBytes;
    if (needed > bytes_from(stream, position)) {
      refuse(observer, count_at, stream_names::kTileCount, [&] {
        return "a tile count that fits: it says " + std::to_string(count) + " tiles of " +
               std::to_string(kIiaTileBytes) + " bytes each (" + std::to_string(needed) +
               " bytes), but only " + std::to_string(bytes_from(stream, position)) + " are left";
      });
      return false;
    }
    series.Tiles.redim(1, count);
    for (Long i = 1; i <= count && in.ok(); ++i) {
      if (observer == nullptr) {
        get_iia_tile(in, series.Tiles(i));
      } else {
        const ObservedRecord tile(observer, field_name<&tIIATileSet::Tiles>(), i);
        get_iia_tile(in, series.Tiles(i));
      }
    }
  }
  if (!in.ok()) return false;

  run = std::move(fresh);
  return true;
}

}  // namespace kvdata::detail
