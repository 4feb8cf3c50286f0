#include "kvdata/automation/create_object.hpp"

#include "kvdata/automation/error.hpp"
#include "kvdata/automation/text.hpp"

namespace kvdata {

std::shared_ptr<Object> CreateObject(std::u16string_view progid) {
  for (const CreatableClass& c : CreatableClasses()) {
    if (equal_ignore_case(c.progid, progid)) return c.create();
  }
  raise(kCannotCreateObject);
}

}  // namespace kvdata
