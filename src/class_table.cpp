// The table of creatable classes, one line per class, in the order in which
// the library lists them. Interface classes and facades are not creatable.
#include "kvdata/automation/create_object.hpp"
#include "kvdata/colour/ilu_d6510.hpp"

namespace kvdata {
namespace {

template <class T>
std::shared_ptr<Object> make() {
  return T::create();
}

constexpr CreatableClass kClasses[] = {
    {u"KVData.ILU_D6510", &make<ILU_D6510>},
};

}  // namespace

std::span<const CreatableClass> CreatableClasses() {
  return std::span<const CreatableClass>(kClasses);
}

}  // namespace kvdata
