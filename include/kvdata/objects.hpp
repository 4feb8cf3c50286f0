#pragma once
// The domain objects: users, tolerances, tolerance sets, tiles, tile sets and
// calibrations; the root object DBManager that creates them and hands out the
// data-access facades.

#include "kvdata/objects/db_manager.hpp"
#include "kvdata/objects/kv_cal_tile.hpp"
#include "kvdata/objects/kv_calibration.hpp"
#include "kvdata/objects/kv_tile.hpp"
#include "kvdata/objects/kv_tile_set.hpp"
#include "kvdata/objects/kv_tol_set.hpp"
#include "kvdata/objects/kv_tolerance.hpp"
#include "kvdata/objects/kv_user.hpp"
