#include "support/progress.hpp"

#include <unistd.h>

#include <cstdio>

namespace kvdata::cli {

Progress::Progress(std::string label, std::size_t total, std::size_t threshold, std::string unit)
    : label_(std::move(label)),
      unit_(unit.empty() ? unit : " " + unit),
      total_(total),
      shown_(total >= threshold && ::isatty(STDERR_FILENO) == 1) {}

Progress::~Progress() {
  if (shown_ && percent_ >= 0) {
    std::fprintf(stderr, "\r\033[K");
    std::fflush(stderr);
  }
}

void Progress::advance(std::size_t done) {
  if (!shown_ || total_ == 0) return;
  const int percent = static_cast<int>(done * 100 / total_);
  if (percent == percent_) return;
  percent_ = percent;
  std::fprintf(stderr, "\r%s: %zu of %zu%s (%d%%)", label_.c_str(), done, total_, unit_.c_str(),
               percent);
  std::fflush(stderr);
}

}  // namespace kvdata::cli
