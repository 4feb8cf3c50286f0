#pragma once
// From a file's spectra to the library's 40-band spectra: bands 1 to 40 are
// 360 to 750 nm at 10 nm, reflectance in percent. A file must have a column
// at each of those wavelengths (finer or wider ranges are fine: the other
// columns are not used, which a warning says). A file that does not cover all 40 is refused with a
// message that says what it does cover; with `extend`, bands missing at
// either end are filled by repeating the nearest measured band, the usual
// practice; a gap inside the range is refused either way.
//
//   std::vector<tSpectrum> s = to_bands(read_spectra("white.csv"), /*extend=*/true);

#include <array>
#include <cstddef>
#include <string>
#include <vector>

#include "kvdata/foundation/records.hpp"
#include "spectra/spectra_table.hpp"

namespace kvdata::cli {

// "380 to 730 nm at 10 nm (36 wavelengths)".
std::string coverage(const std::vector<double>& wavelengths);

// For bands 1 to 40 (index 0 to 39), the index in `wavelengths` (any order,
// no repeats) of the column whose value the band takes. InputError naming
// `file` when the wavelengths do not cover the bands; otherwise a warning on
// standard error lists the wavelengths that are none of the bands (below,
// between or above them), if any.
std::array<std::size_t, 40> band_columns(const std::string& file,
                                         const std::vector<double>& wavelengths, bool extend);

// One tSpectrum per row, values rounded to Single.
std::vector<tSpectrum> to_bands(const SpectraTable& table, bool extend);

}  // namespace kvdata::cli
