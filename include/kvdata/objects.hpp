#pragma once
// The domain objects of the library.

#include "kvdata/objects/kv_cal_tile.hpp"
#include "kvdata/objects/kv_calibration.hpp"
#include "kvdata/objects/kv_tile.hpp"
#include "kvdata/objects/kv_tile_set.hpp"
