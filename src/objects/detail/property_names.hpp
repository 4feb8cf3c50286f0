#pragma once
// The name of an object's property as its description spells it, checked at
// compile time: a name the object does not stream does not compile.
//
//   constexpr std::string_view kName =
//   kvdata::detail::property_name<kvdata::KVTolerance>("TolName");

#include <string_view>

#include "kvdata/objects/object_fields.hpp"

namespace kvdata::detail {

template <DescribedObject Class>
consteval std::string_view property_name(std::string_view name) {
  std::string_view found;
  for_each_property<Class>([&](const auto& p) {
    if (p.name == name) found = p.name;
  });
  if (found.empty()) throw "not a property the object streams";
  return found;
}

}  // namespace kvdata::detail
