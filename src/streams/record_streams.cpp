// The codec-based record streams: SC pair, tile set with calibration,
// profile and station.

#include <cstddef>
#include <string_view>
#include <utility>

#include "streams/detail/field_cursor.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/detail/record_streams.hpp"

namespace kvdata::detail {
namespace {

// Type name of the profile tables, carried in the profile stream.
constexpr std::u16string_view kProfileDataTypeName = u"tOVProfileDataV1";

// Fewest bytes a tile of the tile-set stream can take: an empty Name (its
// count), ColorRGB, TempComp, and its certified pair of spectra.
constexpr std::size_t kMinTileSetTileBytes = 4 + 4 + 40 * 4 + 80 * 4;
static_assert(kMinTileSetTileBytes == 488);
// Certified and TempCalibrated, between the tiles and the certified spectra.
constexpr std::size_t kCalibrationHeaderBytes = 8 + 4;

}  // namespace

bool write_sc_pair(const tSCPair& pair, ByteArray& stream, Long& position) {
  return FieldWriter(stream, position).put_sc_pair(pair).ok();
}

bool read_sc_pair(const ByteArray& stream, Long& position, tSCPair& pair) {
  return FieldReader(stream, position).get_sc_pair(pair).ok();
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
  Long count = 0;
  FieldReader in(stream, position);
  in.get_string(fresh_set.TSN).get_long(count);
  if (!in.ok()) return false;
  if (count < 1 || count > kMaxTileSetTiles) return false;
  const auto needed =
      static_cast<std::size_t>(count) * kMinTileSetTileBytes + kCalibrationHeaderBytes;
  if (needed > bytes_from(stream, position)) return false;

  fresh_set.Tiles.redim(1, count);
  fresh_calibration.Tiles.redim(1, count);
  for (Long i = 1; i <= count && in.ok(); ++i) {
    tTileDef& tile = fresh_set.Tiles(i);
    in.get_string(tile.Name).get_long(tile.ColorRGB).get_spectrum(tile.TempComp);
  }
  fresh_calibration.TSN = fresh_set.TSN;
  in.get_date(fresh_calibration.Certified).get_single(fresh_calibration.TempCalibrated);
  for (Long i = 1; i <= count && in.ok(); ++i) in.get_sc_pair(fresh_calibration.Tiles(i));
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
  in.get_string(profile.ISN).get_date(profile.Created).get_boolean(profile.Validated);
  String type_name;
  in.get_string(type_name);
  if (!in.ok() || type_name != kProfileDataTypeName) return false;

  tOVProfileDataV1 tables;
  for (Long k = 0; k <= 1; ++k) {
    for (Long band = 1; band <= kBandCount; ++band) {
      in.get_single(tables.wCal(k).Data(band))
          .get_single(tables.wave(k).Data(band))
          .get_single(tables.Linear(k).Data(band))
          .get_single(tables.Dark(k).Data(band));
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
  return FieldReader(stream, position)
      .get_string(station.StationGUID)
      .get_string(station.StationName)
      .get_string(station.StationMail)
      .ok();
}

}  // namespace kvdata::detail
