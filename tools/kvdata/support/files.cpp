#include "support/files.hpp"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <iostream>
#include <limits>

#include "support/errors.hpp"
#include "support/output_file.hpp"

namespace kvdata::cli {
namespace {

std::string reason(int err) {
  return std::strerror(err);
}

std::string read_all(const std::string& path) {
  InputFile file(path);
  std::string text;
  char buf[1 << 16];
  for (;;) {
    const std::size_t n = file.read(buf, sizeof buf);
    if (n == 0) break;
    text.append(buf, n);
  }
  return text;
}

}  // namespace

InputFile::InputFile(const std::string& path) : path_(path) {
  fd_ = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
  if (fd_ < 0) bad_input(path + ": cannot open: " + reason(errno));
  struct stat st {};
  if (::fstat(fd_, &st) != 0) {
    const int err = errno;
    ::close(fd_);
    bad_input(path + ": cannot read: " + reason(err));
  }
  if (S_ISDIR(st.st_mode)) {
    ::close(fd_);
    bad_input(path + ": is a directory, not a file");
  }
  if (S_ISREG(st.st_mode)) size_ = static_cast<std::size_t>(st.st_size);
}

InputFile::~InputFile() {
  ::close(fd_);
}

std::size_t InputFile::read(char* to, std::size_t room) {
  for (;;) {
    const ssize_t n = ::read(fd_, to, room);
    if (n >= 0) return static_cast<std::size_t>(n);
    if (errno != EINTR) bad_input(path_ + ": read error: " + reason(errno));
  }
}

std::vector<Byte> read_bytes(const std::string& path) {
  const std::string text = read_all(path);
  return std::vector<Byte>(text.begin(), text.end());
}

ByteArray read_byte_array(const std::string& path) {
  InputFile file(path);
  ByteArray bytes(0, -1);
  // One more than the file's size, so that the read that finds the end
  // needs no growth.
  bytes.reserve(file.size() + 1);
  char buf[1 << 16];
  for (;;) {
    const std::size_t n = file.read(buf, sizeof buf);
    if (n == 0) break;
    const Long at = bytes.ubound() + 1;
    if (n > static_cast<std::size_t>(std::numeric_limits<Long>::max() - at)) {
      bad_input(path + ": is too large for a stream");
    }
    bytes.redim_preserve(0, at + static_cast<Long>(n) - 1);
    std::memcpy(bytes.data() + at, buf, n);
  }
  return bytes;
}

std::string read_text(const std::string& path) {
  return read_all(path);
}

void write_atomically(const std::string& path, std::span<const Byte> content) {
  OutputFile out(path, /*dash_is_stdout=*/false);
  out.write(std::string_view(reinterpret_cast<const char*>(content.data()), content.size()));
  out.commit();
}

void write_atomically(const std::string& path, std::string_view content) {
  write_atomically(
      path, std::span<const Byte>(reinterpret_cast<const Byte*>(content.data()), content.size()));
}

void write_output(const std::string& path, std::string_view content) {
  if (path.empty() || path == "-") {
    std::cout.write(content.data(), static_cast<std::streamsize>(content.size()));
    std::cout.flush();
    if (!std::cout) bad_input("standard output: write failed");
    return;
  }
  write_atomically(path, content);
}

}  // namespace kvdata::cli
