#pragma once
// The object model foundation: records, enumerations, table names and the
// common interfaces of the domain objects.

#include "kvdata/foundation/db_definitions.hpp"
#include "kvdata/foundation/enums.hpp"
#include "kvdata/foundation/ikv_cal_tile.hpp"
#include "kvdata/foundation/ikv_calibration.hpp"
#include "kvdata/foundation/ikv_db_object.hpp"
#include "kvdata/foundation/ikv_obj.hpp"
#include "kvdata/foundation/ikv_obj_creator.hpp"
#include "kvdata/foundation/ikv_profile.hpp"
#include "kvdata/foundation/ikv_security.hpp"
#include "kvdata/foundation/ikv_stream.hpp"
#include "kvdata/foundation/ikv_tile.hpp"
#include "kvdata/foundation/ikv_tile_set.hpp"
#include "kvdata/foundation/ikv_tol_set.hpp"
#include "kvdata/foundation/ikv_tolerance.hpp"
#include "kvdata/foundation/records.hpp"
