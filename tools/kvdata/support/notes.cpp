#include "support/notes.hpp"

#include <iostream>

namespace kvdata::cli {
namespace {

bool quiet_ = false;
bool verbose_ = false;

}  // namespace

void set_quiet(bool quiet) {
  quiet_ = quiet;
}

void set_verbose(bool verbose) {
  verbose_ = verbose;
}

bool verbose() {
  return verbose_;
}

void note(const std::string& text) {
  if (!quiet_) std::cerr << "kvdata: " << text << '\n';
}

}  // namespace kvdata::cli
