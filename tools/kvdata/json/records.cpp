#include "json/records.hpp"

#include "json/dates.hpp"
#include "json/fields.hpp"
#include "json/numbers.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

template <class T>
Json write_array(const Array<T>& a) {
  Json out = Json::array();
  for (const T& item : a) out.push_back(write_record(item));
  return out;
}

// A JSON array into a dynamic array with indices 1..N; [] gives no bounds.
template <class T>
void read_array_of(const Json& j, const std::string& path, Array<T>& out) {
  read_array(j, path);
  Array<T> fresh;
  if (!j.empty()) {
    fresh.redim(1, static_cast<Long>(j.size()));
    Long i = 1;
    for (const Json& item : j) {
      read_record(item, element(path, i), fresh(i));
      ++i;
    }
  }
  out = std::move(fresh);
}

template <Long Lo, Long Hi>
Json write_singles(const FixedArray<Single, Lo, Hi>& a) {
  Json out = Json::array();
  for (Single v : a) out.push_back(single_to_json(v));
  return out;
}

template <Long Lo, Long Hi>
void read_singles(const Json& j, const std::string& path, FixedArray<Single, Lo, Hi>& out) {
  read_array(j, path, FixedArray<Single, Lo, Hi>::kSize);
  Long i = Lo;
  for (const Json& v : j) {
    out(i) = single_from_json(v, element(path, i));
    ++i;
  }
}

// The two Singles of a tDeltas field, indexed by eSC.
Json write_sc_singles(const FixedArray<Single, 0, 1>& a) {
  Json out = Json::object();
  out["SCE"] = single_to_json(a(eSC::SCE));
  out["SCI"] = single_to_json(a(eSC::SCI));
  return out;
}

void read_sc_singles(const Json& j, const std::string& path, FixedArray<Single, 0, 1>& out) {
  Fields f(j, path);
  out(eSC::SCE) = single_from_json(f.get("SCE"), f.at("SCE"));
  out(eSC::SCI) = single_from_json(f.get("SCI"), f.at("SCI"));
  f.done();
}

}  // namespace

Json write_test_result(eTestResult v) {
  switch (v) {
    case eTestResult::Certified:
      return "Certified";
    case eTestResult::Pass:
      return "Pass";
    case eTestResult::Fail:
      return "Fail";
    case eTestResult::NA:
      return "NA";
  }
  return static_cast<Long>(v);
}

eTestResult read_test_result(const Json& j, const std::string& path) {
  if (j.is_string()) {
    const auto& s = j.get_ref<const std::string&>();
    if (s == "Certified") return eTestResult::Certified;
    if (s == "Pass") return eTestResult::Pass;
    if (s == "Fail") return eTestResult::Fail;
    if (s == "NA") return eTestResult::NA;
    bad_input(path + ": expected Certified, Pass, Fail, NA or a number, found " + describe(j));
  }
  return static_cast<eTestResult>(read_long(j, path));
}

Json write_record(const tSpectrum& r) {
  return write_singles(r.Data);
}

void read_record(const Json& j, const std::string& path, tSpectrum& r) {
  read_singles(j, path, r.Data);
}

Json write_record(const FixedArray<tSpectrum, 0, 1>& r) {
  Json out = Json::object();
  out["SCE"] = write_record(r(eSC::SCE));
  out["SCI"] = write_record(r(eSC::SCI));
  return out;
}

void read_record(const Json& j, const std::string& path, FixedArray<tSpectrum, 0, 1>& r) {
  Fields f(j, path);
  read_record(f.get("SCE"), f.at("SCE"), r(eSC::SCE));
  read_record(f.get("SCI"), f.at("SCI"), r(eSC::SCI));
  f.done();
}

Json write_record(const tSCPair& r) {
  return write_record(r.Spectrum);
}

void read_record(const Json& j, const std::string& path, tSCPair& r) {
  read_record(j, path, r.Spectrum);
}

Json write_record(const tTileDef& r) {
  Json out = Json::object();
  out["Name"] = string_to_json(r.Name);
  out["ColorRGB"] = r.ColorRGB;
  out["TempComp"] = write_record(r.TempComp);
  return out;
}

void read_record(const Json& j, const std::string& path, tTileDef& r) {
  Fields f(j, path);
  r.Name = read_string(f.get("Name"), f.at("Name"));
  r.ColorRGB = read_long(f.get("ColorRGB"), f.at("ColorRGB"));
  read_record(f.get("TempComp"), f.at("TempComp"), r.TempComp);
  f.done();
}

Json write_record(const tTileSet& r) {
  Json out = Json::object();
  out["TSN"] = string_to_json(r.TSN);
  out["Tiles"] = write_array(r.Tiles);
  return out;
}

void read_record(const Json& j, const std::string& path, tTileSet& r) {
  Fields f(j, path);
  r.TSN = read_string(f.get("TSN"), f.at("TSN"));
  read_array_of(f.get("Tiles"), f.at("Tiles"), r.Tiles);
  f.done();
}

Json write_record(const tTileSetCalibration& r) {
  Json out = Json::object();
  out["TSN"] = string_to_json(r.TSN);
  out["Certified"] = date_to_json(r.Certified);
  out["TempCalibrated"] = single_to_json(r.TempCalibrated);
  out["Tiles"] = write_array(r.Tiles);
  return out;
}

void read_record(const Json& j, const std::string& path, tTileSetCalibration& r) {
  Fields f(j, path);
  r.TSN = read_string(f.get("TSN"), f.at("TSN"));
  r.Certified = date_from_json(f.get("Certified"), f.at("Certified"));
  r.TempCalibrated = single_from_json(f.get("TempCalibrated"), f.at("TempCalibrated"));
  read_array_of(f.get("Tiles"), f.at("Tiles"), r.Tiles);
  f.done();
}

Json write_record(const tTSListInfo& r) {
  Json out = Json::object();
  out["TSN"] = string_to_json(r.TSN);
  out["Certified"] = date_to_json(r.Certified);
  return out;
}

void read_record(const Json& j, const std::string& path, tTSListInfo& r) {
  Fields f(j, path);
  r.TSN = read_string(f.get("TSN"), f.at("TSN"));
  r.Certified = date_from_json(f.get("Certified"), f.at("Certified"));
  f.done();
}

Json write_record(const tOrganization& r) {
  Json out = Json::object();
  out["ID"] = r.ID;
  out["Organization"] = string_to_json(r.Organization);
  out["ParentOrgID"] = r.ParentOrgID;
  out["RootOrgID"] = r.RootOrgID;
  out["Alias"] = string_to_json(r.Alias);
  out["Avail"] = string_to_json(r.Avail);
  return out;
}

void read_record(const Json& j, const std::string& path, tOrganization& r) {
  Fields f(j, path);
  r.ID = read_long(f.get("ID"), f.at("ID"));
  r.Organization = read_string(f.get("Organization"), f.at("Organization"));
  r.ParentOrgID = read_long(f.get("ParentOrgID"), f.at("ParentOrgID"));
  r.RootOrgID = read_long(f.get("RootOrgID"), f.at("RootOrgID"));
  r.Alias = read_string(f.get("Alias"), f.at("Alias"));
  r.Avail = read_string(f.get("Avail"), f.at("Avail"));
  f.done();
}

Json write_record(const tStation& r) {
  Json out = Json::object();
  out["StationGUID"] = string_to_json(r.StationGUID);
  out["StationName"] = string_to_json(r.StationName);
  out["StationMail"] = string_to_json(r.StationMail);
  return out;
}

void read_record(const Json& j, const std::string& path, tStation& r) {
  Fields f(j, path);
  r.StationGUID = read_string(f.get("StationGUID"), f.at("StationGUID"));
  r.StationName = read_string(f.get("StationName"), f.at("StationName"));
  r.StationMail = read_string(f.get("StationMail"), f.at("StationMail"));
  f.done();
}

Json write_record(const tUser& r) {
  Json out = Json::object();
  out["USERID"] = string_to_json(r.USERID);
  out["UserNumber"] = r.UserNumber;
  out["LastName"] = string_to_json(r.LastName);
  out["FirstName"] = string_to_json(r.FirstName);
  out["UserPWD"] = string_to_json(r.UserPWD);
  out["UserMail"] = string_to_json(r.UserMail);
  out["OrgID"] = r.OrgID;
  out["RoleCode"] = string_to_json(r.RoleCode);
  out["Disabled"] = string_to_json(r.Disabled);
  return out;
}

void read_record(const Json& j, const std::string& path, tUser& r) {
  Fields f(j, path);
  r.USERID = read_string(f.get("USERID"), f.at("USERID"));
  r.UserNumber = read_long(f.get("UserNumber"), f.at("UserNumber"));
  r.LastName = read_string(f.get("LastName"), f.at("LastName"));
  r.FirstName = read_string(f.get("FirstName"), f.at("FirstName"));
  r.UserPWD = read_string(f.get("UserPWD"), f.at("UserPWD"));
  r.UserMail = read_string(f.get("UserMail"), f.at("UserMail"));
  r.OrgID = read_long(f.get("OrgID"), f.at("OrgID"));
  r.RoleCode = read_string(f.get("RoleCode"), f.at("RoleCode"));
  r.Disabled = read_string(f.get("Disabled"), f.at("Disabled"));
  f.done();
}

Json write_record(const tTestStats& r) {
  Json out = Json::object();
  out["TestResult"] = write_test_result(r.TestResult);
  out["TestExplain"] = string_to_json(r.TestExplain);
  out["TestStart"] = date_to_json(r.TestStart);
  out["TestEnd"] = date_to_json(r.TestEnd);
  return out;
}

void read_record(const Json& j, const std::string& path, tTestStats& r) {
  Fields f(j, path);
  r.TestResult = read_test_result(f.get("TestResult"), f.at("TestResult"));
  r.TestExplain = read_string(f.get("TestExplain"), f.at("TestExplain"));
  r.TestStart = date_from_json(f.get("TestStart"), f.at("TestStart"));
  r.TestEnd = date_from_json(f.get("TestEnd"), f.at("TestEnd"));
  f.done();
}

Json write_record(const tTUD_LightLevels& r) {
  Json out = Json::object();
  out["Stats"] = write_record(r.Stats);
  Json levels = Json::array();
  for (const tSpectrum& s : r.LightLevels) levels.push_back(write_record(s));
  out["LightLevels"] = std::move(levels);
  return out;
}

void read_record(const Json& j, const std::string& path, tTUD_LightLevels& r) {
  Fields f(j, path);
  read_record(f.get("Stats"), f.at("Stats"), r.Stats);
  r.LightLevels = {};
  if (const Json* levels = f.find("LightLevels")) {
    const std::string at = f.at("LightLevels");
    read_array(*levels, at, r.LightLevels.size());
    Long i = 1;
    for (const Json& s : *levels) {
      read_record(s, element(at, i), r.LightLevels(i));
      ++i;
    }
  }
  f.done();
}

Json write_record(const tTUD_Repeatability& r) {
  Json out = Json::object();
  out["Stats"] = write_record(r.Stats);
  out["BlueTileStdDev"] = write_record(r.BlueTileStdDev);
  out["BlueTileMaxdE"] = single_to_json(r.BlueTileMaxdE);
  out["BlueTileRMSdE"] = single_to_json(r.BlueTileRMSdE);
  out["BlueTileDriftdE"] = single_to_json(r.BlueTileDriftdE);
  out["WhiteTileStdDev"] = write_record(r.WhiteTileStdDev);
  out["WhiteTileMaxdE"] = single_to_json(r.WhiteTileMaxdE);
  out["WhiteTileRMSdE"] = single_to_json(r.WhiteTileRMSdE);
  out["WhiteTileDriftdE"] = single_to_json(r.WhiteTileDriftdE);
  return out;
}

void read_record(const Json& j, const std::string& path, tTUD_Repeatability& r) {
  Fields f(j, path);
  read_record(f.get("Stats"), f.at("Stats"), r.Stats);
  read_record(f.get("BlueTileStdDev"), f.at("BlueTileStdDev"), r.BlueTileStdDev);
  r.BlueTileMaxdE = single_from_json(f.get("BlueTileMaxdE"), f.at("BlueTileMaxdE"));
  r.BlueTileRMSdE = single_from_json(f.get("BlueTileRMSdE"), f.at("BlueTileRMSdE"));
  r.BlueTileDriftdE = single_from_json(f.get("BlueTileDriftdE"), f.at("BlueTileDriftdE"));
  read_record(f.get("WhiteTileStdDev"), f.at("WhiteTileStdDev"), r.WhiteTileStdDev);
  r.WhiteTileMaxdE = single_from_json(f.get("WhiteTileMaxdE"), f.at("WhiteTileMaxdE"));
  r.WhiteTileRMSdE = single_from_json(f.get("WhiteTileRMSdE"), f.at("WhiteTileRMSdE"));
  r.WhiteTileDriftdE = single_from_json(f.get("WhiteTileDriftdE"), f.at("WhiteTileDriftdE"));
  f.done();
}

Json write_record(const tIIATile& r) {
  Json out = Json::object();
  out["Trial"] = write_record(r.Trial);
  out["TrialProfiled"] = write_record(r.TrialProfiled);
  return out;
}

void read_record(const Json& j, const std::string& path, tIIATile& r) {
  Fields f(j, path);
  read_record(f.get("Trial"), f.at("Trial"), r.Trial);
  read_record(f.get("TrialProfiled"), f.at("TrialProfiled"), r.TrialProfiled);
  f.done();
}

Json write_record(const tIIATileSet& r) {
  Json out = Json::object();
  out["Tiles"] = write_array(r.Tiles);
  out["Profile"] = date_to_json(r.Profile);
  return out;
}

void read_record(const Json& j, const std::string& path, tIIATileSet& r) {
  Fields f(j, path);
  read_array_of(f.get("Tiles"), f.at("Tiles"), r.Tiles);
  r.Profile = date_from_json(f.get("Profile"), f.at("Profile"));
  f.done();
}

Json write_record(const tTUD_IIA& r) {
  Json out = Json::object();
  out["Stats"] = write_record(r.Stats);
  out["TSN"] = string_to_json(r.TSN);
  out["CalStandard"] = date_to_json(r.CalStandard);
  Json series = Json::array();
  for (const tIIATileSet& s : r.Measurements) series.push_back(write_record(s));
  out["Measurements"] = std::move(series);
  out["Has2Measurement"] = r.Has2Measurement;
  return out;
}

void read_record(const Json& j, const std::string& path, tTUD_IIA& r) {
  Fields f(j, path);
  read_record(f.get("Stats"), f.at("Stats"), r.Stats);
  r.TSN = read_string(f.get("TSN"), f.at("TSN"));
  r.CalStandard = date_from_json(f.get("CalStandard"), f.at("CalStandard"));
  const std::string at = f.at("Measurements");
  const Json& series = read_array(f.get("Measurements"), at, r.Measurements.size());
  Long i = 1;
  for (const Json& s : series) {
    read_record(s, element(at, i), r.Measurements(i));
    ++i;
  }
  r.Has2Measurement = read_bool(f.get("Has2Measurement"), f.at("Has2Measurement"));
  f.done();
}

Json write_record(const tTestRun1& r) {
  Json out = Json::object();
  out["ISN"] = string_to_json(r.ISN);
  out["UserNumber"] = r.UserNumber;
  out["StationGUID"] = string_to_json(r.StationGUID);
  out["TestDate"] = date_to_json(r.TestDate);
  out["Comment"] = string_to_json(r.Comment);
  out["Stats"] = write_record(r.Stats);
  out["CommunicationsTest"] = write_record(r.CommunicationsTest);
  out["LightLevels"] = write_record(r.LightLevels);
  out["Repeatability"] = write_record(r.Repeatability);
  out["IIA"] = write_record(r.IIA);
  return out;
}

void read_record(const Json& j, const std::string& path, tTestRun1& r) {
  Fields f(j, path);
  r.ISN = read_string(f.get("ISN"), f.at("ISN"));
  r.UserNumber = read_long(f.get("UserNumber"), f.at("UserNumber"));
  r.StationGUID = read_string(f.get("StationGUID"), f.at("StationGUID"));
  r.TestDate = date_from_json(f.get("TestDate"), f.at("TestDate"));
  r.Comment = read_string(f.get("Comment"), f.at("Comment"));
  read_record(f.get("Stats"), f.at("Stats"), r.Stats);
  read_record(f.get("CommunicationsTest"), f.at("CommunicationsTest"), r.CommunicationsTest);
  read_record(f.get("LightLevels"), f.at("LightLevels"), r.LightLevels);
  read_record(f.get("Repeatability"), f.at("Repeatability"), r.Repeatability);
  read_record(f.get("IIA"), f.at("IIA"), r.IIA);
  f.done();
}

Json write_record(const tDeltas& r) {
  Json out = Json::object();
  out["dL"] = write_sc_singles(r.dL);
  out["dA"] = write_sc_singles(r.dA);
  out["dB"] = write_sc_singles(r.dB);
  out["dE"] = write_sc_singles(r.dE);
  return out;
}

void read_record(const Json& j, const std::string& path, tDeltas& r) {
  Fields f(j, path);
  read_sc_singles(f.get("dL"), f.at("dL"), r.dL);
  read_sc_singles(f.get("dA"), f.at("dA"), r.dA);
  read_sc_singles(f.get("dB"), f.at("dB"), r.dB);
  read_sc_singles(f.get("dE"), f.at("dE"), r.dE);
  f.done();
}

Json write_record(const tTileDeltas& r) {
  Json out = Json::object();
  out["Deltas"] = write_array(r.Deltas);
  out["avgDeltaE"] = write_sc_singles(r.avgDeltaE);
  return out;
}

void read_record(const Json& j, const std::string& path, tTileDeltas& r) {
  Fields f(j, path);
  read_array_of(f.get("Deltas"), f.at("Deltas"), r.Deltas);
  read_sc_singles(f.get("avgDeltaE"), f.at("avgDeltaE"), r.avgDeltaE);
  f.done();
}

Json write_record(const tOVProfileDataV1& r) {
  Json out = Json::object();
  out["wCal"] = write_record(r.wCal);
  out["wave"] = write_record(r.wave);
  out["Linear"] = write_record(r.Linear);
  out["Dark"] = write_record(r.Dark);
  return out;
}

void read_record(const Json& j, const std::string& path, tOVProfileDataV1& r) {
  Fields f(j, path);
  read_record(f.get("wCal"), f.at("wCal"), r.wCal);
  read_record(f.get("wave"), f.at("wave"), r.wave);
  read_record(f.get("Linear"), f.at("Linear"), r.Linear);
  read_record(f.get("Dark"), f.at("Dark"), r.Dark);
  f.done();
}

Json write_record(const tOVProfile& r) {
  Json out = Json::object();
  out["ISN"] = string_to_json(r.ISN);
  out["Created"] = date_to_json(r.Created);
  out["Validated"] = r.Validated;
  if (const auto* data = r.ProfileData.get_if<tOVProfileDataV1>()) {
    out["ProfileData"] = write_record(*data);
  } else {
    out["ProfileData"] = nullptr;
  }
  return out;
}

void read_record(const Json& j, const std::string& path, tOVProfile& r) {
  Fields f(j, path);
  r.ISN = read_string(f.get("ISN"), f.at("ISN"));
  r.Created = date_from_json(f.get("Created"), f.at("Created"));
  r.Validated = read_bool(f.get("Validated"), f.at("Validated"));
  const Json& data = f.get("ProfileData");
  if (data.is_null()) {
    r.ProfileData = Variant();
  } else {
    tOVProfileDataV1 tables;
    read_record(data, f.at("ProfileData"), tables);
    r.ProfileData = Variant(std::move(tables));
  }
  f.done();
}

Json write_record(const tOVProfilePatch& r) {
  Json out = Json::object();
  out["ISN"] = string_to_json(r.ISN);
  out["Created"] = date_to_json(r.Created);
  out["Validated"] = r.Validated;
  out["ProfileData"] = write_record(r.ProfileData);
  return out;
}

void read_record(const Json& j, const std::string& path, tOVProfilePatch& r) {
  Fields f(j, path);
  r.ISN = read_string(f.get("ISN"), f.at("ISN"));
  r.Created = date_from_json(f.get("Created"), f.at("Created"));
  r.Validated = read_bool(f.get("Validated"), f.at("Validated"));
  read_record(f.get("ProfileData"), f.at("ProfileData"), r.ProfileData);
  f.done();
}

}  // namespace kvdata::cli
