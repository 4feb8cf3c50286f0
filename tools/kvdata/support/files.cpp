#include "support/files.hpp"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <iostream>

#include "support/errors.hpp"

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

// Permissions for a new output file: what open() would give under the umask.
mode_t new_file_mode() {
  const mode_t mask = ::umask(0);
  ::umask(mask);
  return static_cast<mode_t>(0666 & ~mask);
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

std::string read_text(const std::string& path) {
  return read_all(path);
}

void write_atomically(const std::string& path, std::span<const Byte> content) {
  if (path.empty()) bad_usage("an output file name is empty");
  std::string temp = path + ".tmp-XXXXXX";
  const int fd = ::mkstemp(temp.data());
  if (fd < 0) bad_input(path + ": cannot create a temporary file beside it: " + reason(errno));
  auto fail = [&](const std::string& what, int err) {
    ::close(fd);
    ::unlink(temp.c_str());
    bad_input(path + ": " + what + ": " + reason(err));
  };
  std::size_t done = 0;
  while (done < content.size()) {
    const ssize_t n = ::write(fd, content.data() + done, content.size() - done);
    if (n < 0) {
      if (errno == EINTR) continue;
      fail("write failed", errno);
    }
    done += static_cast<std::size_t>(n);
  }
  if (::fchmod(fd, new_file_mode()) != 0) fail("cannot set permissions", errno);
  if (::fsync(fd) != 0) fail("cannot flush", errno);
  if (::close(fd) != 0) {
    const int err = errno;
    ::unlink(temp.c_str());
    bad_input(path + ": close failed: " + reason(err));
  }
  if (::rename(temp.c_str(), path.c_str()) != 0) {
    const int err = errno;
    ::unlink(temp.c_str());
    bad_input(path + ": cannot replace: " + reason(err));
  }
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
