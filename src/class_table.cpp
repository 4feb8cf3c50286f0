// The table of creatable classes, one line per class, in the order in which
// the library lists them. Interface classes and facades are not creatable.
#include "kvdata/automation/create_object.hpp"
#include "kvdata/objects/kv_cal_tile.hpp"
#include "kvdata/objects/kv_calibration.hpp"
#include "kvdata/objects/kv_tile.hpp"
#include "kvdata/objects/kv_tile_set.hpp"
#include "kvdata/streams/streams.hpp"

namespace kvdata {
namespace {

template <class T>
std::shared_ptr<Object> make() {
  return T::create();
}

// Filled as the classes are added: {u"KVData.KVUser", &make<KVUser>}, ...
constexpr CreatableClass kClasses[] = {
    {u"KVData.KVTile", &make<KVTile>},
    {u"KVData.KVCalTile", &make<KVCalTile>},
    {u"KVData.KVCalibration", &make<KVCalibration>},
    {u"KVData.KVTileSet", &make<KVTileSet>},
    {u"KVData.Streams", &make<Streams>},
};

}  // namespace

std::span<const CreatableClass> CreatableClasses() {
  return std::span<const CreatableClass>(kClasses);
}

}  // namespace kvdata
