#pragma once
// The object model foundation: records, enumerations, table names, the
// common interfaces of the domain objects and the data-access facades.

#include "kvdata/foundation/cal_standards.hpp"
#include "kvdata/foundation/db_definitions.hpp"
#include "kvdata/foundation/enums.hpp"
#include "kvdata/foundation/ikv_db_object.hpp"
#include "kvdata/foundation/ikv_obj.hpp"
#include "kvdata/foundation/ikv_obj_creator.hpp"
#include "kvdata/foundation/ikv_security.hpp"
#include "kvdata/foundation/ikv_stream.hpp"
#include "kvdata/foundation/ikv_tol_set.hpp"
#include "kvdata/foundation/ikv_tolerance.hpp"
#include "kvdata/foundation/organizations.hpp"
#include "kvdata/foundation/profiles.hpp"
#include "kvdata/foundation/records.hpp"
#include "kvdata/foundation/server_db.hpp"
#include "kvdata/foundation/stations.hpp"
#include "kvdata/foundation/test_run1.hpp"
#include "kvdata/foundation/test_run1_iterator.hpp"
#include "kvdata/foundation/users.hpp"
