#pragma once
// Progress of long work (large measurement files) on standard error, shown
// only when standard error is a terminal, so that pipes and logs stay clean.
// The line is redrawn in place when the whole percentage changes and cleared
// when the work ends.
//
//   Progress progress("reading white.csv", rows);
//   for (std::size_t i = 0; i < rows; ++i) { ...; progress.advance(i + 1); }

#include <cstddef>
#include <string>

namespace kvdata::cli {

class Progress {
 public:
  // Work below `threshold` items is too short to be worth a progress line.
  // `unit` follows the total ("bytes").
  Progress(std::string label, std::size_t total, std::size_t threshold = 2000,
           std::string unit = "");
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  // `done` items of `total` are finished.
  void advance(std::size_t done);

 private:
  std::string label_;
  std::string unit_;
  std::size_t total_;
  bool shown_;
  int percent_ = -1;
};

}  // namespace kvdata::cli
