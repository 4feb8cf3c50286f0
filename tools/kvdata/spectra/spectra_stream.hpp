#pragma once
// Spectra of a measurement file, a block at a time, already on the 40 bands
// (see bands.hpp), so that a command can convert and write a block before it
// reads the next and its memory does not grow with the file. CSV files are
// read as they go; CGATS files are parsed whole by Little CMS first and then
// handed out in blocks the same way.
//
//   SpectraStream in("white.csv", /*extend=*/false);
//   SpectraBlock block;
//   while (in.next(block, 4096)) ... block.bands (40 per spectrum), block.labels

#include <array>
#include <cstddef>
#include <memory>
#include <string>
#include <vector>

#include "kvdata/automation/types.hpp"
#include "spectra/spectra_table.hpp"

namespace kvdata::cli {

class CsvSpectraReader;
class InputFile;
class Progress;

struct SpectraBlock {
  std::size_t count = 0;
  std::vector<Single> bands;        // 40 per spectrum, band 1 (360 nm) first
  std::vector<std::string> labels;  // per spectrum: its name, or "line 5" / "set 3"
  std::vector<bool> named;          // per spectrum: whether its label is its name
};

class SpectraStream {
 public:
  // Opens the file and reads its header. InputError as read_spectra: a file
  // that is missing, unreadable or empty, a header without wavelengths, a
  // wavelength with two columns.
  SpectraStream(const std::string& path, bool extend);
  ~SpectraStream();
  SpectraStream(const SpectraStream&) = delete;
  SpectraStream& operator=(const SpectraStream&) = delete;

  // Replaces the block's spectra with the next `max` (fewer at the end of
  // the file); false when there are none left. The first call raises
  // InputError for a file without data rows, a bad row in the first block,
  // then a file without the 40 bands (as to_bands); later ones for a bad
  // row, naming its line.
  bool next(SpectraBlock& block, std::size_t max);

  const std::string& file() const { return path_; }
  // True when the file has a column or field of sample names (a row may
  // still leave its name empty).
  bool named() const;
  // Spectra handed out so far.
  std::size_t count() const { return count_; }
  // The highest value read so far (0 when none is positive).
  double highest() const { return highest_; }

 private:
  std::string path_;
  bool extend_;
  bool started_ = false;
  std::size_t count_ = 0;
  double highest_ = 0;
  // CSV, read as it goes.
  std::unique_ptr<InputFile> input_;
  std::unique_ptr<CsvSpectraReader> csv_;
  std::unique_ptr<Progress> progress_;
  std::vector<double> values_;  // the block's rows, one value per column
  std::size_t width_ = 0;       // columns per row
  // CGATS, read whole.
  std::unique_ptr<SpectraTable> table_;
  std::array<std::size_t, 40> columns_{};
};

}  // namespace kvdata::cli
