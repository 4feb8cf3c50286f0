#!/usr/bin/env bash
# Runs the checks too long for every test run (minutes, not milliseconds):
# the fast power lanes against std::pow for every Single above the linear
# threshold. Uses the dev build; run after `cmake --build --preset dev`.
#   scripts/exhaustive-checks.sh [BUILD_DIR]   (default: build/dev)
set -euo pipefail
build=${1:-build/dev}
"$build/tests/kvdata_colour_tests" --gtest_also_run_disabled_tests --gtest_filter='*.DISABLED_*'
