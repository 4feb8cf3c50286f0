#include "kvdata/foundation/organizations.hpp"

namespace kvdata {

std::shared_ptr<Organizations> Organizations::create() {
  return std::shared_ptr<Organizations>(new Organizations());
}

bool Organizations::Update(const tOrganization& /*Org*/) {
  return false;
}

bool Organizations::Retrieve(const String& /*OrgAlias*/, tOrganization& /*Org*/) {
  return false;
}

Array<tOrganization> Organizations::List() {
  return {};
}

bool Organizations::Delete(const String& /*OrgAlias*/) {
  return false;
}

bool Organizations::AddNew(const tOrganization& /*Org*/) {
  return false;
}

}  // namespace kvdata
