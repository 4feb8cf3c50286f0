#pragma once
// KVData: client-side data library for keeping colour-measuring instruments
// in calibration. This header includes every public header.
//
//   #include <kvdata/kvdata.hpp>
//   auto user = kvdata::CreateObject(u"KVData.KVUser");

#include "kvdata/automation.hpp"
#include "kvdata/foundation.hpp"
#include "kvdata/objects.hpp"
#include "kvdata/streams.hpp"
#include "kvdata/colour.hpp"
#include "kvdata/stats.hpp"
