#pragma once
// Statistics: the spread test of a white and a blue tile, and the summary of
// a set of colour differences.

#include "kvdata/stats/kv_test_run_spread_test_data.hpp"
#include "kvdata/stats/summary.hpp"
