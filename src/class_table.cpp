// The table of creatable classes, one line per class, in the order in which
// the library lists them. Interface classes and facades are not creatable.
#include "kvdata/automation/create_object.hpp"
#include "kvdata/colour/ilu_d6510.hpp"
#include "kvdata/stats/kv_test_run_spread_test_data.hpp"

namespace kvdata {
namespace {

template <class T>
std::shared_ptr<Object> make() {
  return T::create();
}

constexpr CreatableClass kClasses[] = {
    {u"KVData.ILU_D6510", &make<ILU_D6510>},
    {u"KVData.KVTestRunSpreadTestData", &make<KVTestRunSpreadTestData>},
};

}  // namespace

std::span<const CreatableClass> CreatableClasses() {
  return std::span<const CreatableClass>(kClasses);
}

}  // namespace kvdata
