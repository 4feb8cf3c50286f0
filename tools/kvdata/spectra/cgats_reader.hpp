#pragma once
// Spectra in CGATS (IT8) measurement files, parsed by Little CMS. Fields
// whose names hold a wavelength (SPECTRAL_NM360, SPECTRAL_360, nm360) are the
// spectrum; SAMPLE_NAME, or else SAMPLE_ID, names each set. Only the first
// table of a multi-table file is read.
//
//   SpectraTable t = read_cgats("white.cgats");

#include <string>
#include <string_view>

#include "spectra/spectra_table.hpp"

namespace kvdata::cli {

// InputError names the line of a set that does not hold one value for each
// field of the data format, refuses a table of more sets than Little CMS
// reads (kCgatsMostSets), gives Little CMS's reason, in the command's words
// and with its line, for a file it cannot parse, and names the set and field
// of a missing or non-numeric value.
SpectraTable read_cgats(const std::string& path);
// The same for a file's text already read; `path` names it in messages.
SpectraTable read_cgats(const std::string& path, std::string_view text);

}  // namespace kvdata::cli
