#pragma once
// Names of the server database's tables. No operation of this library opens
// them; they are published for clients and the server.
//
//   kvdata::kTblUsers == u"tblUsers"

#include <string_view>

namespace kvdata {

inline constexpr std::u16string_view kTblTileColorNames = u"tblTileColorNames";
inline constexpr std::u16string_view kTblTileSets = u"tblTileSets";
inline constexpr std::u16string_view kTblTileSetCalibrations = u"tblTileSetCalibrations";
inline constexpr std::u16string_view kTblTestRunsTileDE = u"tblTestRunsTileDE";
inline constexpr std::u16string_view kTblTileSetCalibrationsSpectral40 =
    u"tblTileSetCalibrationsSpectral40";
inline constexpr std::u16string_view kTblStations = u"tblStations";
inline constexpr std::u16string_view kTblInstruments = u"tblInstruments";
inline constexpr std::u16string_view kTblUsers = u"tblUsers";
inline constexpr std::u16string_view kTblProfiles = u"tblProfiles";
inline constexpr std::u16string_view kTblProfilesSpectral40 = u"tblProfilesSpectral40";
inline constexpr std::u16string_view kTblTestRunsSpectral40 = u"tblTestRunsSpectral40";
inline constexpr std::u16string_view kTblTestRuns = u"tblTestRuns";
inline constexpr std::u16string_view kTblServerLog = u"tblServerLog";
inline constexpr std::u16string_view kTblISNOwners = u"tblISNOwners";
inline constexpr std::u16string_view kTblOrganizations = u"tblOrganizations";
inline constexpr std::u16string_view kTblReportUsers = u"tblReportUsers";

}  // namespace kvdata
