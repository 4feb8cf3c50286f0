#pragma once
// The private writer and reader behind each Stream_ operation of Streams.
// Each returns True when the whole record went through and False at the
// first refusal or failed value; they may also raise (no memory), which the
// calling operation traps at its boundary.
//
//   if (!kvdata::detail::write_station(station, bytes, pos)) return false;
//   ok = kvdata::detail::read_station(bytes, pos, station);

#include <cstddef>
#include <string_view>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/records.hpp"
#include "kvdata/streams/streams.hpp"

namespace kvdata::detail {

// Sizes of the two fixed-size record blocks.
inline constexpr std::size_t kUserStreamBlockBytes = Streams::kUserBlockBytes;
inline constexpr std::size_t kOrganizationBlockBytes = Streams::kOrganizationBlockBytes;

// The argument names of the Stream_ operations. Each reader enters the
// record it reads under the name of its argument, as a caller sees it.
inline constexpr std::string_view kSCPairArgument = "SCP";
inline constexpr std::string_view kTileSetArgument = "TS";
inline constexpr std::string_view kCalibrationArgument = "TSC";
inline constexpr std::string_view kProfileArgument = "pro";
inline constexpr std::string_view kStationArgument = "Station";
inline constexpr std::string_view kTestRunArgument = "TR";
inline constexpr std::string_view kUserArgument = "User";
inline constexpr std::string_view kOrganizationArgument = "Org";

// Largest tile count of the tile-set stream (its tile counter is 8-bit).
inline constexpr Long kMaxTileSetTiles = 254;

[[nodiscard]] bool write_sc_pair(const tSCPair& pair, ByteArray& stream, Long& position);
[[nodiscard]] bool read_sc_pair(const ByteArray& stream, Long& position, tSCPair& pair);

[[nodiscard]] bool write_tile_set_calibration(const tTileSet& set,
                                              const tTileSetCalibration& calibration,
                                              ByteArray& stream, Long& position);
[[nodiscard]] bool read_tile_set_calibration(const ByteArray& stream, Long& position, tTileSet& set,
                                             tTileSetCalibration& calibration);

[[nodiscard]] bool write_profile(const tOVProfile& profile, ByteArray& stream, Long& position);
[[nodiscard]] bool read_profile(const ByteArray& stream, Long& position, tOVProfile& profile);

[[nodiscard]] bool write_station(const tStation& station, ByteArray& stream, Long& position);
[[nodiscard]] bool read_station(const ByteArray& stream, Long& position, tStation& station);

[[nodiscard]] bool write_test_run(const tTestRun1& run, ByteArray& stream, Long& position);
[[nodiscard]] bool read_test_run(const ByteArray& stream, Long& position, tTestRun1& run);

[[nodiscard]] bool write_user_block(const tUser& user, ByteArray& stream, Long& position);
[[nodiscard]] bool read_user_block(const ByteArray& stream, Long& position, tUser& user);

[[nodiscard]] bool write_organization_block(const tOrganization& org, ByteArray& stream,
                                            Long& position);
[[nodiscard]] bool read_organization_block(const ByteArray& stream, Long& position,
                                           tOrganization& org);

}  // namespace kvdata::detail
