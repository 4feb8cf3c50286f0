#pragma once
// The kinds of stream the command reads and writes: the object streams and
// the record streams, by the names used on the command line.
//
//   auto kind = parse_kind("tileset-calibration");   // StreamKind::TileSetCalibration
//   kind_name(StreamKind::UserBlock) == "user-block";

#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace kvdata::cli {

enum class StreamKind {
  // object streams
  User,
  Tolerance,
  TolSet,
  Tile,
  TileSet,
  Calibration,
  Profile,
  TestRun,
  // record streams
  SCPair,
  TileSetCalibration,
  ProfileRecord,
  Station,
  TestRunRecord,
  UserBlock,
  Organization,
};

struct KindInfo {
  StreamKind kind;
  std::string_view name;     // command-line word
  std::string_view summary;  // one line for --help
  bool object;               // an object stream (IKVStream) rather than a record stream
};

std::span<const KindInfo> all_kinds();
const KindInfo& info(StreamKind kind);
std::string_view kind_name(StreamKind kind);
std::optional<StreamKind> parse_kind(std::string_view word);
// "user, tolerance, ..." for messages.
std::string kind_list();

}  // namespace kvdata::cli
