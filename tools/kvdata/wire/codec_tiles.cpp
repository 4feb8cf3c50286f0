// The tile, tile set and calibration objects, through their IKVStream.
#include "json/fields.hpp"
#include "json/records.hpp"
#include "kvdata/objects/kv_calibration.hpp"
#include "kvdata/objects/kv_tile.hpp"
#include "kvdata/objects/kv_tile_set.hpp"
#include "support/errors.hpp"
#include "support/library_log.hpp"
#include "wire/codec.hpp"
#include "wire/codec_parts.hpp"

namespace kvdata::cli::codec {
namespace {

constexpr Long kTileCount = 13;
constexpr std::size_t kNameUnits = 50;
constexpr std::size_t kCalibrationTsnUnits = 8;

// A tile set and a calibration always have 13 tiles: their readers read 13.
template <class T>
void check_thirteen(const Array<T>& tiles, const std::string& path) {
  const std::size_t n = tiles.has_bounds() ? tiles.size() : 0;
  if (n != static_cast<std::size_t>(kTileCount)) {
    bad_input(path + ": " + std::to_string(n) + " tiles, but a " +
              (path.find("Calibration") != std::string::npos ? "calibration" : "tile set") +
              " has 13");
  }
}

}  // namespace

bool decode_tile_objects(StreamKind kind, const ByteArray& a, Json& doc) {
  switch (kind) {
    case StreamKind::Tile: {
      auto tile = KVTile::create();
      object_in(*tile, a, "tile");
      doc["v1Tile"] = write_record(tile->v1Tile());
      return true;
    }
    case StreamKind::TileSet: {
      auto set = KVTileSet::create();
      object_in(*set, a, "tile set");
      doc["v1TileSet"] = write_record(set->v1TileSet());
      return true;
    }
    case StreamKind::Calibration: {
      auto cal = KVCalibration::create();
      object_in(*cal, a, "calibration");
      doc["v1Calibration"] = write_record(cal->v1Calibration());
      return true;
    }
    default:
      return false;
  }
}

bool encode_tile_objects(StreamKind kind, const Json& doc, std::vector<Byte>& out) {
  switch (kind) {
    case StreamKind::Tile: {
      const auto def = document_member<tTileDef>(doc, "v1Tile");
      check_width(def.Name, kNameUnits, "v1Tile.Name");
      auto tile = KVTile::create();
      tile->v1Tile(def);
      out = object_out(*tile, "tile");
      return true;
    }
    case StreamKind::TileSet: {
      const auto ts = document_member<tTileSet>(doc, "v1TileSet");
      check_thirteen(ts.Tiles, "v1TileSet.Tiles");
      for (Long i = 1; i <= kTileCount; ++i) {
        check_width(ts.Tiles(i).Name, kNameUnits,
                    "v1TileSet.Tiles(" + std::to_string(i) + ").Name");
      }
      auto set = KVTileSet::create();
      set->v1TileSet(ts);
      out = object_out(*set, "tile set");
      return true;
    }
    case StreamKind::Calibration: {
      const auto tsc = document_member<tTileSetCalibration>(doc, "v1Calibration");
      check_width(tsc.TSN, kCalibrationTsnUnits, "v1Calibration.TSN");
      check_thirteen(tsc.Tiles, "v1Calibration.Tiles");
      auto cal = KVCalibration::create();
      cal->v1Calibration(tsc);
      out = object_out(*cal, "calibration");
      return true;
    }
    default:
      return false;
  }
}

}  // namespace kvdata::cli::codec
