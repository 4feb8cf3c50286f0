#include "wire/stream_kind.hpp"

#include <array>

namespace kvdata::cli {
namespace {

constexpr std::array kKinds = {
    KindInfo{StreamKind::User, "user", "a user object: stamp 1.2 and its 844-byte block", true},
    KindInfo{StreamKind::Tolerance, "tolerance", "a tolerance object: its 748-byte record", true},
    KindInfo{StreamKind::TolSet, "tolset", "a tolerance set: header and member tolerances", true},
    KindInfo{StreamKind::Tile, "tile", "a tile definition: its 264-byte block", true},
    KindInfo{StreamKind::TileSet, "tileset", "a tile set object: TSN and 13 tile blocks", true},
    KindInfo{StreamKind::Calibration, "calibration",
             "a tile set calibration object: its 4188-byte block", true},
    KindInfo{StreamKind::Profile, "profile", "an instrument profile: stamp 1.4 and its tables",
             true},
    KindInfo{StreamKind::TestRun, "testrun",
             "a test run object: version, test run record, light-level data", true},
    KindInfo{StreamKind::SCPair, "scpair", "an SC pair record: SCE and SCI spectra", false},
    KindInfo{StreamKind::TileSetCalibration, "tileset-calibration",
             "a tile set and its calibration records in one stream", false},
    KindInfo{StreamKind::ProfileRecord, "profile-record", "a profile record with its tables",
             false},
    KindInfo{StreamKind::Station, "station", "a station record", false},
    KindInfo{StreamKind::TestRunRecord, "testrun-record", "a test run record", false},
    KindInfo{StreamKind::UserBlock, "user-block", "a user record's 261-byte block", false},
    KindInfo{StreamKind::Organization, "organization", "an organisation record's 133-byte block",
             false},
};

}  // namespace

std::span<const KindInfo> all_kinds() {
  return kKinds;
}

const KindInfo& info(StreamKind kind) {
  for (const auto& k : kKinds) {
    if (k.kind == kind) return k;
  }
  return kKinds.front();  // unreachable: every enumerator is listed
}

std::string_view kind_name(StreamKind kind) {
  return info(kind).name;
}

std::optional<StreamKind> parse_kind(std::string_view word) {
  for (const auto& k : kKinds) {
    if (k.name == word) return k.kind;
  }
  return std::nullopt;
}

std::string kind_list() {
  std::string out;
  for (const auto& k : kKinds) {
    if (!out.empty()) out += ", ";
    out += k.name;
  }
  return out;
}

}  // namespace kvdata::cli
