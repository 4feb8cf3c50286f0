#pragma once
// The library's root object: hands out the data-access facades and creates
// domain objects from a type word. Its database operations are inert.
//
//   auto manager = kvdata::DBManager::create();
//   auto set = manager->Create(u" tolset ");   // the manager's shared tolerance set

#include <memory>

#include "kvdata/automation/object.hpp"
#include "kvdata/foundation/cal_standards.hpp"
#include "kvdata/foundation/enums.hpp"
#include "kvdata/foundation/ikv_obj.hpp"
#include "kvdata/foundation/ikv_obj_creator.hpp"
#include "kvdata/foundation/organizations.hpp"
#include "kvdata/foundation/profiles.hpp"
#include "kvdata/foundation/server_db.hpp"
#include "kvdata/foundation/stations.hpp"
#include "kvdata/foundation/test_run1.hpp"
#include "kvdata/foundation/users.hpp"

namespace kvdata {

class KVTolSet;

// Each facade is created on its first request and the same one is returned
// for the life of this DBManager; another DBManager has facades of its own.
// Objects handed out stay alive after the DBManager is gone as long as a
// caller holds them.
class DBManager : public IKVObjCreator {
 public:
  static std::shared_ptr<DBManager> create();

  // Drops, when present and in this order: the calibration-standards,
  // profiles, stations, users, test-runs and server-database facades, the
  // shared tolerance set, the organisations facade.
  ~DBManager() override;

  std::shared_ptr<Organizations> DBOrganizations();
  // False: no database is ever open in this library.
  bool IsOpen() const;
  std::shared_ptr<CalStandards> DBCalStandards();
  std::shared_ptr<Profiles> DBProfiles();
  std::shared_ptr<Stations> DBStations();
  std::shared_ptr<USers> DBUsers();
  std::shared_ptr<TestRun1> DBTestRuns();
  std::shared_ptr<ServerDB> DBServerDB();
  // False; no argument is read and nothing is opened.
  bool OpenDB(const eDBProviders& PROV, const String& Database, const String& Server = {},
              const String& UID = {}, const String& PWD = {}, const String& Driver = {});
  // False; no file is created.
  bool CreateDBJET(const String& MDBFile);
  // False; nothing is created.
  bool CreateDBMSSQL(const String& Server, const String& Database, const String& UID,
                     const String& PWD);
  // False; nothing is created.
  bool CreateServerDB(const String& ConnectionString);

  // Raised after a database was opened; declared for clients to connect to,
  // never raised in this library since no database is ever opened.
  Event<> DBOpened;

 protected:
  // The type word, without surrounding blanks and compared without regard to
  // case, selects: "TolSet" the one tolerance set this DBManager shares
  // (created on the first such request); "TileSet", "Calibration",
  // "TestRunTileDEs" and "TestRun" a new object of that kind. Any other word
  // gives no object, without an error.
  std::shared_ptr<IKVObj> IKVObjCreator_Create(const String& ObjectType) override;

 private:
  DBManager() = default;

  std::shared_ptr<CalStandards> cal_standards_;
  std::shared_ptr<Profiles> profiles_;
  std::shared_ptr<Stations> stations_;
  std::shared_ptr<USers> users_;
  std::shared_ptr<TestRun1> test_runs_;
  std::shared_ptr<ServerDB> server_db_;
  std::shared_ptr<KVTolSet> tol_set_;
  std::shared_ptr<Organizations> organizations_;
};

}  // namespace kvdata
