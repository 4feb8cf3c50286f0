#include "kvdata/objects/db_manager.hpp"

#include "kvdata/automation/text.hpp"
#include "kvdata/objects/kv_calibration.hpp"
#include "kvdata/objects/kv_test_run.hpp"
#include "kvdata/objects/kv_test_run_tiles_de.hpp"
#include "kvdata/objects/kv_tile_set.hpp"
#include "kvdata/objects/kv_tol_set.hpp"

namespace kvdata {
namespace {

// The facade in `slot`, created there on first use.
template <class Facade>
std::shared_ptr<Facade> first_use(std::shared_ptr<Facade>& slot) {
  if (!slot) slot = Facade::create();
  return slot;
}

}  // namespace

std::shared_ptr<DBManager> DBManager::create() {
  return std::shared_ptr<DBManager>(new DBManager());
}

DBManager::~DBManager() {
  cal_standards_.reset();
  profiles_.reset();
  stations_.reset();
  users_.reset();
  test_runs_.reset();
  server_db_.reset();
  tol_set_.reset();
  organizations_.reset();
}

std::shared_ptr<Organizations> DBManager::DBOrganizations() {
  return first_use(organizations_);
}

bool DBManager::IsOpen() const {
  return false;
}

std::shared_ptr<CalStandards> DBManager::DBCalStandards() {
  return first_use(cal_standards_);
}

std::shared_ptr<Profiles> DBManager::DBProfiles() {
  return first_use(profiles_);
}

std::shared_ptr<Stations> DBManager::DBStations() {
  return first_use(stations_);
}

std::shared_ptr<USers> DBManager::DBUsers() {
  return first_use(users_);
}

std::shared_ptr<TestRun1> DBManager::DBTestRuns() {
  return first_use(test_runs_);
}

std::shared_ptr<ServerDB> DBManager::DBServerDB() {
  return first_use(server_db_);
}

bool DBManager::OpenDB(const eDBProviders& /*PROV*/, const String& /*Database*/,
                       const String& /*Server*/, const String& /*UID*/, const String& /*PWD*/,
                       const String& /*Driver*/) {
  return false;
}

bool DBManager::CreateDBJET(const String& /*MDBFile*/) {
  return false;
}

bool DBManager::CreateDBMSSQL(const String& /*Server*/, const String& /*Database*/,
                              const String& /*UID*/, const String& /*PWD*/) {
  return false;
}

bool DBManager::CreateServerDB(const String& /*ConnectionString*/) {
  return false;
}

std::shared_ptr<IKVObj> DBManager::IKVObjCreator_Create(const String& ObjectType) {
  const String word = to_upper(trim_blanks(ObjectType));
  // Compared in this order with the upper-case form of each type word.
  if (word == to_upper(u"TolSet")) {
    if (!tol_set_) tol_set_ = KVTolSet::create();
    return tol_set_;
  }
  if (word == to_upper(u"TileSet")) return KVTileSet::create();
  if (word == to_upper(u"Calibration")) return KVCalibration::create();
  if (word == to_upper(u"TestRunTileDEs")) return KVTestRunTilesDE::create();
  if (word == to_upper(u"TestRun")) return KVTestRun::create();
  return nullptr;
}

}  // namespace kvdata
