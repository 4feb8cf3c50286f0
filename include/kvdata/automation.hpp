#pragma once
// The automation layer: scalar types, arrays, Variant, errors, objects,
// collections, the event log and the ANSI code page.

#include "kvdata/automation/ansi.hpp"
#include "kvdata/automation/array.hpp"
#include "kvdata/automation/collection.hpp"
#include "kvdata/automation/create_object.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/event_log.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/automation/variant.hpp"
