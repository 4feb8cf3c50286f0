#include "support/output_file.hpp"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

constexpr std::size_t kBufferBytes = std::size_t{1} << 20;

// Permissions for a new output file: what open() would give under the umask.
mode_t new_file_mode() {
  const mode_t mask = ::umask(0);
  ::umask(mask);
  return static_cast<mode_t>(0666 & ~mask);
}

}  // namespace

OutputFile::OutputFile(const std::string& path, bool dash_is_stdout) {
  if (!dash_is_stdout && path.empty()) bad_usage("an output file name is empty");
  buffer_.reserve(kBufferBytes);
  if (dash_is_stdout && (path.empty() || path == "-")) {
    fd_ = STDOUT_FILENO;
    return;
  }
  path_ = path;
  temp_ = path + ".tmp-XXXXXX";
  fd_ = ::mkstemp(temp_.data());
  if (fd_ < 0) {
    bad_input(path + ": cannot create a temporary file beside it: " + std::strerror(errno));
  }
}

OutputFile::~OutputFile() {
  if (path_.empty() || done_) return;
  ::close(fd_);
  ::unlink(temp_.c_str());
}

void OutputFile::fail(const std::string& what, int err) {
  if (path_.empty()) bad_input("standard output: " + what);
  done_ = true;
  ::close(fd_);
  ::unlink(temp_.c_str());
  bad_input(path_ + ": " + what + ": " + std::strerror(err));
}

void OutputFile::write(std::string_view text) {
  if (buffer_.size() + text.size() <= kBufferBytes) {
    buffer_.append(text);
    return;
  }
  flush();
  if (text.size() >= kBufferBytes) {
    write_all(text);  // large pieces go out without a copy
  } else {
    buffer_.append(text);
  }
}

void OutputFile::flush() {
  write_all(buffer_);
  buffer_.clear();
}

void OutputFile::write_all(std::string_view bytes) {
  std::size_t done = 0;
  while (done < bytes.size()) {
    const ssize_t n = ::write(fd_, bytes.data() + done, bytes.size() - done);
    if (n < 0) {
      if (errno == EINTR) continue;
      fail("write failed", errno);
    }
    done += static_cast<std::size_t>(n);
  }
}

void OutputFile::commit() {
  flush();
  if (path_.empty()) return;
  if (::fchmod(fd_, new_file_mode()) != 0) fail("cannot set permissions", errno);
  if (::fsync(fd_) != 0) fail("cannot flush", errno);
  done_ = true;
  if (::close(fd_) != 0) {
    const int err = errno;
    ::unlink(temp_.c_str());
    bad_input(path_ + ": close failed: " + std::strerror(err));
  }
  if (::rename(temp_.c_str(), path_.c_str()) != 0) {
    const int err = errno;
    ::unlink(temp_.c_str());
    bad_input(path_ + ": cannot replace: " + std::strerror(err));
  }
}

}  // namespace kvdata::cli
