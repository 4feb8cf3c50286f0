#include "kvdata/foundation/users.hpp"

namespace kvdata {

std::shared_ptr<USers> USers::create() {
  return std::shared_ptr<USers>(new USers());
}

bool USers::ExistsUser(const Long& /*OrgID*/, const String& /*USERID*/) {
  return false;
}

bool USers::AddNew(const tUser& /*RHS*/) {
  return false;
}

bool USers::Update(const tUser& /*RHS*/) {
  return false;
}

bool USers::Retrieve(const Long& /*UserNumber*/, tUser& /*User*/) {
  return false;
}

bool USers::RetrieveOrgUser(const Long& /*OrgID*/, const String& /*USERID*/, tUser& /*User*/) {
  return false;
}

bool USers::Delete(const Long& /*OrgID*/, const String& /*USERID*/) {
  return false;
}

Array<tUser> USers::List() {
  return {};
}

}  // namespace kvdata
