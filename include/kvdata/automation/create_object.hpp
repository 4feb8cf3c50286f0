#pragma once
// Creation of the library's creatable classes by name.
//
//   auto user = kvdata::CreateObject(u"KVData.KVUser");   // error 429 for other names
//
// Threads: both functions may be called from any number of threads at once.

#include <memory>
#include <span>
#include <string_view>

#include "kvdata/automation/object.hpp"

namespace kvdata {

// One creatable class: its programmatic name ("KVData.KVUser") and factory.
struct CreatableClass {
  std::u16string_view progid;
  std::shared_ptr<Object> (*create)();
};

// Every creatable class of the library, in a fixed order.
std::span<const CreatableClass> CreatableClasses();

// A new object of the class named `progid` (compared without regard to case).
// Any other name, including interfaces and facades, raises error 429.
std::shared_ptr<Object> CreateObject(std::u16string_view progid);

}  // namespace kvdata
