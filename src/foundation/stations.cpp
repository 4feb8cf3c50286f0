#include "kvdata/foundation/stations.hpp"

namespace kvdata {

std::shared_ptr<Stations> Stations::create() {
  return std::shared_ptr<Stations>(new Stations());
}

bool Stations::AddNew(const tStation& /*RHS*/) {
  return false;
}

bool Stations::Update(const tStation& /*RHS*/) {
  return false;
}

bool Stations::Retrieve(const String& /*StationGUID*/, tStation& /*Station*/) {
  return false;
}

bool Stations::Delete(const String& /*StationGUID*/) {
  return false;
}

Array<tStation> Stations::List() {
  return {};
}

}  // namespace kvdata
