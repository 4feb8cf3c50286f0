#pragma once
// Spectral measurements as read from a CSV or CGATS file: the wavelengths of
// the file's spectral columns and one row of values per sample, with where
// each row came from so that messages can point at it.
//
//   SpectraTable t = read_spectra("white.csv");   // CSV or CGATS, told from the content
//   for (const SpectrumRow& r : t.rows) ... r.values[i] is at t.wavelengths[i] nm

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace kvdata::cli {

struct SpectrumRow {
  std::string name;            // sample name, or empty when the file has none
  std::size_t place = 0;       // CSV: line number; CGATS: set number (1-based)
  std::vector<double> values;  // one per wavelength, in the order of `wavelengths`
};

struct SpectraTable {
  std::string file;
  std::string format;               // "CSV" or "CGATS"
  std::vector<double> wavelengths;  // nm, ascending, no repeats
  std::vector<SpectrumRow> rows;
  bool named = false;  // the file has a column or field of sample names

  // "white.csv line 5" or "white.cgats set 3".
  std::string where(const SpectrumRow& row) const;
  // The row's name, or "line 5" / "set 3" when it has none.
  std::string label(const SpectrumRow& row) const;
};

// Reads a CSV or CGATS file (CGATS when it has a BEGIN_DATA_FORMAT section).
// InputError names the file and the line, set or field that is wrong.
SpectraTable read_spectra(const std::string& path);
// The same for a file's text already read; `path` names it in messages.
SpectraTable read_spectra(const std::string& path, const std::string& text);

// The wavelength in a column or field name such as "360", "nm360", "R360",
// "360nm", "SPECTRAL_NM360" or "SPECTRAL_360"; negative when the name holds
// no wavelength from 300 to 1100 nm.
double wavelength_of(const std::string& column);

// InputError naming `where` ("white.csv line 5") when a sample name is not
// UTF-8 text, which no JSON, SVG or CGATS output could carry.
void check_sample_name(std::string_view name, const std::string& where);

// Sorts the spectral columns by wavelength (rows follow); InputError when a
// wavelength appears twice.
void order_columns(SpectraTable& table);

}  // namespace kvdata::cli
