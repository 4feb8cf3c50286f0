#pragma once
// The domain objects: users, tolerances, tolerance sets, tiles, tile sets,
// calibrations, profiles, test runs and test-run tile deltas; the root object
// DBManager that creates them and hands out the data-access facades.

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
#include "kvdata/objects/object_fields.hpp"
