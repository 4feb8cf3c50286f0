#include "kvdata/foundation/cal_standards.hpp"

namespace kvdata {

std::shared_ptr<CalStandards> CalStandards::create() {
  return std::shared_ptr<CalStandards>(new CalStandards());
}

bool CalStandards::ExistsTileSet(const String& /*TSN*/) {
  return false;
}

bool CalStandards::ExistsCalibration(const String& /*TSN*/, const Date& /*Certified*/) {
  return false;
}

bool CalStandards::AddNewTileSet(const tTileSet& /*RHS*/) {
  return false;
}

bool CalStandards::RetrieveTileSet(const String& /*TSN*/, tTileSet& /*RHS*/) {
  return false;
}

bool CalStandards::DeleteTileSet(const String& /*TSN*/) {
  return false;
}

Array<tTSListInfo> CalStandards::ListTileSets() {
  return {};
}

bool CalStandards::AddNewCalibration(const tTileSetCalibration& /*RHS*/) {
  return false;
}

bool CalStandards::RetrieveCalibration(const String& /*TSN*/, tTileSetCalibration& /*RHS*/,
                                       const Variant* /*DateCertified*/) {
  return false;
}

bool CalStandards::DeleteCalibration(const String& /*TSN*/, const Date& /*Certified*/) {
  return false;
}

Array<Date> CalStandards::ListCalibrations(const String& /*TSN*/) {
  return {};
}

}  // namespace kvdata
