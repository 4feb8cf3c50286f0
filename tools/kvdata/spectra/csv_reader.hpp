#pragma once
// Spectra in CSV: a header row, then one sample per row. Columns whose names
// hold a wavelength ("360", "nm360", "R360", "360nm", "SPECTRAL_NM360") are
// the spectrum; a column named SAMPLE_NAME, SAMPLE_ID, NAME, SAMPLE, ID or
// LABEL (any case) names the sample, otherwise a first column that is not
// spectral does; other columns are ignored. The separator is a comma, or a
// semicolon or tab when the header has no comma. Cells may be quoted with
// double quotes. Empty lines and lines starting with # are skipped.
//
//   SpectraTable t = read_csv("white.csv", read_text("white.csv"));

#include <string>

#include "spectra/spectra_table.hpp"

namespace kvdata::cli {

// InputError names the file, the line and the column of the first bad cell.
SpectraTable read_csv(const std::string& path, const std::string& text);

}  // namespace kvdata::cli
