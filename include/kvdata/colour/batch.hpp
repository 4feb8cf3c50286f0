#pragma once
// Many spectra to CIE XYZ and CIELAB at once (D65, 1964 10-degree observer),
// for clients that convert whole measurement files or thousands of tiles.
// Every result is bit for bit what ILU_D6510's calcXYZ followed by calcLAB
// gives for the same spectrum; the work runs across spectra in parallel lanes.
//
//   std::vector<float> xyz(3 * n), lab(3 * n);
//   kvdata::calc_xyz_lab_d6510(bands, xyz, lab);   // bands: 40 * n values
//
// Threads: any number of threads may convert at once, each into results of
// its own; the tables they share are constant.

#include <cstddef>
#include <span>

#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Converts the spectra in `spectra`, 40 bands each, one spectrum after the
// other (band 1 first, percent reflectance), into `xyz` (X, Y, Z per
// spectrum) and `lab` (L*, a*, b* per spectrum). `xyz` and `lab` must hold
// exactly 3 values per spectrum and must not overlap `spectra` or each other;
// otherwise error 5 is raised and nothing is written.
//
// A spectrum whose conversion overflows a Single or meets a NaN (where
// calcXYZ or calcLAB would raise error 6) gets NaN in all six of its
// results; the others are converted normally. Returns the number of such
// spectra.
[[nodiscard]] std::size_t calc_xyz_lab_d6510(std::span<const Single> spectra, std::span<Single> xyz,
                                             std::span<Single> lab);

// The same for spectra held as records.
[[nodiscard]] std::size_t calc_xyz_lab_d6510(std::span<const tSpectrum> spectra,
                                             std::span<Single> xyz, std::span<Single> lab);

}  // namespace kvdata
