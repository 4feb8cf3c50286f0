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
//   CsvSpectraReader r(std::move(records));  while (r.next(values)) ... r.name(), r.line()

#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "spectra/csv_records.hpp"
#include "spectra/spectra_table.hpp"

namespace kvdata::cli {

// The rows of a CSV spectra file one at a time.
class CsvSpectraReader {
 public:
  // Reads the header row. InputError for an empty file or a header without
  // wavelength columns.
  CsvSpectraReader(std::string path, CsvRecords records);

  const std::string& file() const { return path_; }
  // Wavelengths of the spectral columns, in the file's column order.
  const std::vector<double>& wavelengths() const { return wavelengths_; }

  // Reads the next row's values (one per wavelength, in the order of
  // wavelengths()) into `values`; false at the end. InputError names the
  // line and column of a row that is wrong.
  bool next(std::span<double> values);
  // The current row's sample name, trimmed (empty when the file has none);
  // valid until the next call to next().
  std::string_view name() const { return name_; }
  // True when a column names the samples.
  bool named() const { return name_column_.has_value(); }
  // The line of the current row.
  std::size_t line() const { return records_.line(); }
  // Bytes of the file read so far.
  std::size_t bytes_read() const { return records_.bytes_read(); }

 private:
  std::string path_;
  CsvRecords records_;
  std::vector<std::string> titles_;  // trimmed header cells
  std::vector<std::size_t> spectral_;
  std::vector<double> wavelengths_;
  std::optional<std::size_t> name_column_;
  std::string_view name_;
  std::vector<double> denominators_;  // of the row being read
};

// The whole file as a table. InputError names the file, the line and the
// column of the first bad cell.
SpectraTable read_csv(const std::string& path, const std::string& text);

}  // namespace kvdata::cli
