#pragma once
// The domain objects of the library.

#include "kvdata/objects/kv_profile.hpp"
