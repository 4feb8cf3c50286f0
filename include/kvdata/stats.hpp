#pragma once
// Repeatability statistics: the spread test of a white and a blue tile.

#include "kvdata/stats/kv_test_run_spread_test_data.hpp"
