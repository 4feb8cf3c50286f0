#include "kvdata/foundation/server_db.hpp"

namespace kvdata {

std::shared_ptr<ServerDB> ServerDB::create() {
  return std::shared_ptr<ServerDB>(new ServerDB());
}

bool ServerDB::AddNewServerOpLog(const String& /*NetClientAddress*/,
                                 const String& /*ClientVersion*/, const Date& /*Opdate*/,
                                 const String& /*OpISN*/, const String& /*OpTSN*/,
                                 const Long& /*OpDuration*/, const bool& /*OpSuccess*/,
                                 const String& /*OpLog*/) {
  return false;
}

bool ServerDB::GetUserISNs(const Long& /*USERID*/, Array<String>& /*ISNs*/) {
  return false;
}

}  // namespace kvdata
