// The codec-based record streams: SC pair, tile set with calibration,
// profile and station.

#include <cstddef>
#include <span>
#include <string>
#include <string_view>
#include <utility>

#include "kvdata/automation/text.hpp"
#include "kvdata/foundation/record_fields.hpp"
#include "streams/detail/field_cursor.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/detail/observe.hpp"
#include "streams/detail/record_streams.hpp"

namespace kvdata::detail {
namespace {

// Type name of the profile tables, carried in the profile stream.
constexpr std::u16string_view kProfileDataTypeName = RecordTraits<tOVProfileDataV1>::kTypeName;

// Where the interleaved values of the profile tables go, by geometry (SCE,
// SCI) and table: wCal.SCE(band), wave.SCE(band), ...
constexpr FieldReader::Slot table_slot(Long sc, std::string_view table) {
  return {table, FieldReader::sc_name(sc == 0 ? eSC::SCE : eSC::SCI)};
}
constexpr FieldReader::Slot kTableSlots[2][4] = {
    {table_slot(0, field_name<&tOVProfileDataV1::wCal>()),
     table_slot(0, field_name<&tOVProfileDataV1::wave>()),
     table_slot(0, field_name<&tOVProfileDataV1::Linear>()),
     table_slot(0, field_name<&tOVProfileDataV1::Dark>())},
    {table_slot(1, field_name<&tOVProfileDataV1::wCal>()),
     table_slot(1, field_name<&tOVProfileDataV1::wave>()),
     table_slot(1, field_name<&tOVProfileDataV1::Linear>()),
     table_slot(1, field_name<&tOVProfileDataV1::Dark>())}};

// The four tables, both geometries, 40 bands each.
constexpr std::size_t kTableBytes = 4 * 2 * kSpectrumBytes;
static_assert(kTableBytes == 1280);

// Fewest bytes a tile of the tile-set stream can take: an empty Name (its
// count), ColorRGB, TempComp, and its certified pair of spectra.
constexpr std::size_t kMinTileSetTileBytes = 4 + 4 + 40 * 4 + 80 * 4;
static_assert(kMinTileSetTileBytes == 488);
static_assert(2 * kSpectrumBytes == Streams::kSCPairBytes);
// Certified and TempCalibrated, between the tiles and the certified spectra.
constexpr std::size_t kCalibrationHeaderBytes = 8 + 4;

}  // namespace

bool write_sc_pair(const tSCPair& pair, ByteArray& stream, Long& position) {
  return FieldWriter(stream, position).put_sc_pair(pair).ok();
}

bool read_sc_pair(const ByteArray& stream, Long& position, tSCPair& pair) {
  FieldReader in(stream, position);
  const ObservedRecord scp(in.observer(), kSCPairArgument);
  return in.get_sc_pair(pair).ok();
}

bool write_tile_set_calibration(const tTileSet& set, const tTileSetCalibration& calibration,
                                ByteArray& stream, Long& position) {
  // Everything that could refuse the record is checked before the first byte.
  if (set.TSN != calibration.TSN) return false;
  if (set.Tiles.rank() != 1) return false;
  const Long lower = set.Tiles.lbound();
  const Long upper = set.Tiles.ubound();
  if (lower < 0 || upper > kMaxTileSetTiles) return false;
  const Long count = upper - lower + 1;
  if (count < 1 || count > kMaxTileSetTiles) return false;  // the reader refuses these
  for (Long i = lower; i <= upper; ++i) {
    if (!calibration.Tiles.contains(i)) return false;
  }

  FieldWriter out(stream, position);
  out.put_string(set.TSN).put_long(count);
  for (Long i = lower; i <= upper && out.ok(); ++i) {
    const tTileDef& tile = set.Tiles(i);
    out.put_string(tile.Name).put_long(tile.ColorRGB).put_spectrum(tile.TempComp);
  }
  out.put_date(calibration.Certified).put_single(calibration.TempCalibrated);
  for (Long i = lower; i <= upper && out.ok(); ++i) out.put_sc_pair(calibration.Tiles(i));
  return out.ok();
}

bool read_tile_set_calibration(const ByteArray& stream, Long& position, tTileSet& set,
                               tTileSetCalibration& calibration) {
  tTileSet fresh_set;
  tTileSetCalibration fresh_calibration;
  FieldReader in(stream, position);
  StreamObserver* const observer = in.observer();
  Long count = 0;
  {
    const ObservedRecord ts(observer, kTileSetArgument);
    in.get<&tTileSet::TSN>(fresh_set);
    const Long count_at = in.position();
    in.get_long(count, stream_names::kTileCount);
    if (!in.ok()) return false;
    if (count < 1 || count > kMaxTileSetTiles) {
      refuse(observer, count_at, stream_names::kTileCount, [&] {
        return "a tile count from 1 to " + std::to_string(kMaxTileSetTiles) + "; found " +
               std::to_string(count);
      });
      return false;
    }
    const auto needed =
        static_cast<std::size_t>(count) * kMinTileSetTileBytes + kCalibrationHeaderBytes;
    if (needed > bytes_from(stream, position)) {
      refuse(observer, count_at, stream_names::kTileCount, [&] {
        return "a tile count that fits: it says " + std::to_string(count) +
               " tiles, which need at least " + std::to_string(needed) + " more bytes, but only " +
               std::to_string(bytes_from(stream, position)) + " are left";
      });
      return false;
    }

    fresh_set.Tiles.redim(1, count);
    fresh_calibration.Tiles.redim(1, count);
    for (Long i = 1; i <= count && in.ok(); ++i) {
      const ObservedRecord element(observer, field_name<&tTileSet::Tiles>(), i);
      tTileDef& tile = fresh_set.Tiles(i);
      in.get<&tTileDef::Name>(tile).get<&tTileDef::ColorRGB>(tile).get<&tTileDef::TempComp>(tile);
    }
  }
  fresh_calibration.TSN = fresh_set.TSN;
  {
    const ObservedRecord tsc(observer, kCalibrationArgument);
    in.get<&tTileSetCalibration::Certified>(fresh_calibration)
        .get<&tTileSetCalibration::TempCalibrated>(fresh_calibration);
    for (Long i = 1; i <= count && in.ok(); ++i) {
      const ObservedRecord element(observer, field_name<&tTileSetCalibration::Tiles>(), i);
      in.get_sc_pair(fresh_calibration.Tiles(i));
    }
  }
  if (!in.ok()) return false;

  set = std::move(fresh_set);
  calibration = std::move(fresh_calibration);
  return true;
}

bool write_profile(const tOVProfile& profile, ByteArray& stream, Long& position) {
  if (profile.ProfileData.record_type_name() != kProfileDataTypeName) return false;
  const auto* tables = profile.ProfileData.get_if<tOVProfileDataV1>();
  if (tables == nullptr) return false;

  FieldWriter out(stream, position);
  out.put_string(profile.ISN).put_date(profile.Created).put_boolean(profile.Validated);
  out.put_string(String(kProfileDataTypeName));
  // Interleaved: per geometry and band, the four tables' values side by side.
  for (Long k = 0; k <= 1; ++k) {
    for (Long band = 1; band <= kBandCount; ++band) {
      out.put_single(tables->wCal(k).Data(band))
          .put_single(tables->wave(k).Data(band))
          .put_single(tables->Linear(k).Data(band))
          .put_single(tables->Dark(k).Data(band));
    }
  }
  return out.ok();
}

bool read_profile(const ByteArray& stream, Long& position, tOVProfile& profile) {
  FieldReader in(stream, position);
  StreamObserver* const observer = in.observer();
  const ObservedRecord pro(observer, kProfileArgument);
  in.get<&tOVProfile::ISN>(profile).get<&tOVProfile::Created>(profile).get<&tOVProfile::Validated>(
      profile);
  String type_name;
  const Long name_at = in.position();
  in.get_string(type_name, stream_names::kRecordName);
  if (!in.ok()) return false;
  if (type_name != kProfileDataTypeName) {
    refuse(observer, name_at, stream_names::kRecordName, [&] {
      return "the data record name \"" + to_utf8(kProfileDataTypeName) + "\"; found \"" +
             to_utf8(type_name) + "\"";
    });
    return false;
  }

  tOVProfileDataV1 tables;
  {
    const ObservedRecord data(observer, field_name<&tOVProfile::ProfileData>());
    FieldReader::Run values = in.run(kTableBytes);
    for (Long k = 0; k <= 1; ++k) {
      const std::span<Single> arrays[] = {tables.wCal(k).Data, tables.wave(k).Data,
                                          tables.Linear(k).Data, tables.Dark(k).Data};
      values.get_side_by_side(arrays, kTableSlots[k]);
    }
  }
  if (!in.ok()) return false;
  profile.ProfileData = Variant(std::move(tables));
  return true;
}

bool write_station(const tStation& station, ByteArray& stream, Long& position) {
  return FieldWriter(stream, position)
      .put_string(station.StationGUID)
      .put_string(station.StationName)
      .put_string(station.StationMail)
      .ok();
}

bool read_station(const ByteArray& stream, Long& position, tStation& station) {
  FieldReader in(stream, position);
  const ObservedRecord record(in.observer(), kStationArgument);
  return in.get<&tStation::StationGUID>(station)
      .get<&tStation::StationName>(station)
      .get<&tStation::StationMail>(station)
      .ok();
}

}  // namespace kvdata::detail
