#include "support/spool.hpp"

#include <algorithm>
#include <cerrno>
#include <cstring>

#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

constexpr std::size_t kMemoryBytes = std::size_t{8} << 20;

[[noreturn]] void spool_failed(int err) {
  bad_input(std::string("cannot set output aside in a temporary file: ") + std::strerror(err));
}

}  // namespace

Spool::~Spool() {
  if (file_ != nullptr) std::fclose(file_);
}

void Spool::spill() {
  if (file_ == nullptr) {
    file_ = std::tmpfile();
    if (file_ == nullptr) spool_failed(errno);
  }
  if (std::fwrite(memory_.data(), 1, memory_.size(), file_) != memory_.size()) spool_failed(errno);
  memory_.clear();
}

void Spool::append(std::string_view bytes) {
  memory_.append(bytes);
  if (memory_.size() >= kMemoryBytes) spill();
}

void Spool::rewind() {
  offset_ = 0;
  if (file_ == nullptr) return;
  spill();
  if (std::fflush(file_) != 0) spool_failed(errno);
  std::rewind(file_);
}

std::size_t Spool::read_some(char* to, std::size_t n) {
  if (file_ != nullptr) {
    const std::size_t got = std::fread(to, 1, n, file_);
    if (got < n && std::ferror(file_)) spool_failed(errno);
    return got;
  }
  const std::size_t got = std::min(n, memory_.size() - offset_);
  std::memcpy(to, memory_.data() + offset_, got);
  offset_ += got;
  return got;
}

bool Spool::read(char* to, std::size_t n) {
  return read_some(to, n) == n;
}

}  // namespace kvdata::cli
