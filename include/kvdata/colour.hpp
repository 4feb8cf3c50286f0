#pragma once
// Colorimetry: spectra to CIE XYZ and CIELAB under D65 with the 1964
// 10-degree observer, one at a time or in batches, and CIELAB differences.

#include "kvdata/colour/batch.hpp"
#include "kvdata/colour/iilluminant.hpp"
#include "kvdata/colour/ilu_d6510.hpp"
