#include "kvdata/foundation/profiles.hpp"

namespace kvdata {

std::shared_ptr<Profiles> Profiles::create() {
  return std::shared_ptr<Profiles>(new Profiles());
}

bool Profiles::ExistsProfile(const String& /*ISN*/, const Variant* /*Created*/,
                             const Variant* /*Validated*/) {
  return false;
}

bool Profiles::AddNew(const tOVProfile& /*RHS*/) {
  return false;
}

bool Profiles::Retrieve(const String& /*ISN*/, const Date& /*DateCreated*/, tOVProfile& /*RHS*/) {
  return false;
}

bool Profiles::RetrieveLatest(const String& /*ISN*/, tOVProfile& /*RHS*/) {
  return false;
}

bool Profiles::Delete(const String& /*ISN*/, const Date& /*Created*/) {
  return false;
}

Array<String> Profiles::ListAvailableProfiles() {
  return {};
}

Array<Date> Profiles::ListInstrumentProfiles(const String& /*ISN*/, const bool& /*Validated*/) {
  return {};
}

}  // namespace kvdata
