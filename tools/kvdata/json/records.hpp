#pragma once
// JSON form of every shared record, field names exactly as the records
// declare them, in declaration order. Conventions:
// - a spectrum (tSpectrum) is its 40 Data values, band 1 (360 nm) first;
// - a pair indexed by eSC (tSCPair, the profile tables) is {"SCE": [...], "SCI": [...]};
// - other fixed arrays are JSON arrays (LightLevels: 8 spectra, Measurements: 2 series);
// - dynamic arrays are JSON arrays; reading gives them indices 1..N, and an
//   empty JSON array gives an array without bounds;
// - Singles and Doubles as json/numbers.hpp, Dates as json/dates.hpp,
//   Booleans as true/false, eTestResult by member name;
// - tOVProfile.ProfileData is its tOVProfileDataV1 record, or null when empty.
// Reading is strict (json/fields.hpp). `optional_light_levels` lets a
// tTUD_LightLevels lack its LightLevels spectra, which no stream carries.
//
//   Json j = write_record(station);
//   tStation back;  read_record(j, "Station", back);

#include <string>

#include "json/json.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata::cli {

Json write_record(const tSpectrum& r);
Json write_record(const tSCPair& r);
Json write_record(const FixedArray<tSpectrum, 0, 1>& r);
Json write_record(const tTileDef& r);
Json write_record(const tTileSet& r);
Json write_record(const tTileSetCalibration& r);
Json write_record(const tTSListInfo& r);
Json write_record(const tOrganization& r);
Json write_record(const tStation& r);
Json write_record(const tUser& r);
Json write_record(const tTestStats& r);
Json write_record(const tTUD_LightLevels& r);
Json write_record(const tTUD_Repeatability& r);
Json write_record(const tIIATile& r);
Json write_record(const tIIATileSet& r);
Json write_record(const tTUD_IIA& r);
Json write_record(const tTestRun1& r);
Json write_record(const tDeltas& r);
Json write_record(const tTileDeltas& r);
Json write_record(const tOVProfileDataV1& r);
Json write_record(const tOVProfile& r);
Json write_record(const tOVProfilePatch& r);

void read_record(const Json& j, const std::string& path, tSpectrum& r);
void read_record(const Json& j, const std::string& path, tSCPair& r);
void read_record(const Json& j, const std::string& path, FixedArray<tSpectrum, 0, 1>& r);
void read_record(const Json& j, const std::string& path, tTileDef& r);
void read_record(const Json& j, const std::string& path, tTileSet& r);
void read_record(const Json& j, const std::string& path, tTileSetCalibration& r);
void read_record(const Json& j, const std::string& path, tTSListInfo& r);
void read_record(const Json& j, const std::string& path, tOrganization& r);
void read_record(const Json& j, const std::string& path, tStation& r);
void read_record(const Json& j, const std::string& path, tUser& r);
void read_record(const Json& j, const std::string& path, tTestStats& r);
void read_record(const Json& j, const std::string& path, tTUD_LightLevels& r);
void read_record(const Json& j, const std::string& path, tTUD_Repeatability& r);
void read_record(const Json& j, const std::string& path, tIIATile& r);
void read_record(const Json& j, const std::string& path, tIIATileSet& r);
void read_record(const Json& j, const std::string& path, tTUD_IIA& r);
void read_record(const Json& j, const std::string& path, tTestRun1& r);
void read_record(const Json& j, const std::string& path, tDeltas& r);
void read_record(const Json& j, const std::string& path, tTileDeltas& r);
void read_record(const Json& j, const std::string& path, tOVProfileDataV1& r);
void read_record(const Json& j, const std::string& path, tOVProfile& r);
void read_record(const Json& j, const std::string& path, tOVProfilePatch& r);

// eTestResult by member name ("Certified", "Pass", "Fail", "NA"); a value
// outside the enumeration as its number.
Json write_test_result(eTestResult v);
eTestResult read_test_result(const Json& j, const std::string& path);

}  // namespace kvdata::cli
