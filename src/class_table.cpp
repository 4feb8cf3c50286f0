// The table of creatable classes, one line per class, in the order in which
// the library lists them. Interface classes and facades are not creatable.
#include "kvdata/automation/create_object.hpp"
#include "kvdata/colour/ilu_d6510.hpp"
#include "kvdata/objects/db_manager.hpp"
#include "kvdata/objects/kv_cal_tile.hpp"
#include "kvdata/objects/kv_calibration.hpp"
#include "kvdata/objects/kv_profile.hpp"
#include "kvdata/objects/kv_test_run.hpp"
#include "kvdata/objects/kv_test_run_tiles_de.hpp"
#include "kvdata/objects/kv_tile.hpp"
#include "kvdata/objects/kv_tile_set.hpp"
#include "kvdata/objects/kv_tol_set.hpp"
#include "kvdata/objects/kv_tolerance.hpp"
#include "kvdata/objects/kv_user.hpp"
#include "kvdata/stats/kv_test_run_spread_test_data.hpp"
#include "kvdata/streams/streams.hpp"

namespace kvdata {
namespace {

template <class T>
std::shared_ptr<Object> make() {
  return T::create();
}

constexpr CreatableClass kClasses[] = {
    {u"KVData.ILU_D6510", &make<ILU_D6510>},
    {u"KVData.KVTile", &make<KVTile>},
    {u"KVData.KVCalTile", &make<KVCalTile>},
    {u"KVData.KVUser", &make<KVUser>},
    {u"KVData.KVTolerance", &make<KVTolerance>},
    {u"KVData.KVTolSet", &make<KVTolSet>},
    {u"KVData.KVCalibration", &make<KVCalibration>},
    {u"KVData.KVTestRunTilesDE", &make<KVTestRunTilesDE>},
    {u"KVData.KVTileSet", &make<KVTileSet>},
    {u"KVData.KVProfile", &make<KVProfile>},
    {u"KVData.DBManager", &make<DBManager>},
    {u"KVData.KVTestRun", &make<KVTestRun>},
    {u"KVData.KVTestRunSpreadTestData", &make<KVTestRunSpreadTestData>},
    {u"KVData.Streams", &make<Streams>},
};

}  // namespace

std::span<const CreatableClass> CreatableClasses() { return kClasses; }

}  // namespace kvdata
