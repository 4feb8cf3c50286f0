// Writing a file by the replacement policy of file_output.hpp, with the
// POSIX file interface: the policy needs what the standard library does not
// offer (exclusive creation with the umask's mode, the target's mode and
// owner, flushing a file and its directory to the disk).

#include "kvdata/streams/file_output.hpp"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <random>
#include <system_error>

namespace kvdata {
namespace {

constexpr std::size_t kBufferBytes = std::size_t{1} << 20;
// Links followed before giving up, as the system does for a path.
constexpr int kMaxLinks = 40;

std::string reason(int err) {
  return std::system_category().message(err);
}

// The folder part of a name: "." for a bare name, "/" for a name in the root.
std::string folder_of(const std::string& path) {
  const std::size_t slash = path.rfind('/');
  if (slash == std::string::npos) return ".";
  return slash == 0 ? "/" : path.substr(0, slash);
}

// The name a path finally refers to, links followed one after another, with
// its status when it exists (`exists` false for a name not yet there, a link
// that points nowhere included). The error number when it cannot be told.
int resolve(std::string path, std::string& resolved, struct stat& st, bool& exists) {
  for (int links = 0; links <= kMaxLinks; ++links) {
    if (::lstat(path.c_str(), &st) != 0) {
      if (errno != ENOENT) return errno;
      resolved = path;
      exists = false;
      return 0;
    }
    if (!S_ISLNK(st.st_mode)) {
      resolved = path;
      exists = true;
      return 0;
    }
    std::string to(static_cast<std::size_t>(st.st_size > 0 ? st.st_size : 255) + 1, '\0');
    const ssize_t n = ::readlink(path.c_str(), to.data(), to.size());
    if (n < 0) return errno;
    if (static_cast<std::size_t>(n) >= to.size()) return ENAMETOOLONG;  // changed meanwhile
    to.resize(static_cast<std::size_t>(n));
    path = to.starts_with('/') || path.find('/') == std::string::npos ? to
                                                                      : folder_of(path) + "/" + to;
  }
  return ELOOP;
}

// Creates a new file with a short hidden name in `folder`, with the mode a
// new file gets under the umask. The descriptor, or -1 with errno set.
int create_beside(const std::string& folder, std::string& name) {
  static constexpr char kDigits[] = "0123456789abcdefghijklmnopqrstuv";
  std::random_device entropy;
  for (int attempt = 0; attempt < 32; ++attempt) {
    std::string leaf = ".kvdata-";
    for (unsigned bits = entropy(), i = 0; i < 6; ++i, bits >>= 5) leaf += kDigits[bits & 31u];
    leaf += ".tmp";
    name = folder + "/" + leaf;
    const int fd = ::open(name.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
    if (fd >= 0 || errno != EEXIST) return fd;
  }
  return -1;
}

}  // namespace

FileOutput::~FileOutput() {
  drop();
}

void FileOutput::drop() {
  if (owned_ && fd_ >= 0) ::close(fd_);
  if (!temporary_.empty()) ::unlink(temporary_.c_str());
  fd_ = -1;
  owned_ = false;
  temporary_.clear();
  buffer_.clear();
}

bool FileOutput::fail(const std::string& what, int err) {
  failure_ = err == 0 ? what : what + ": " + reason(err);
  drop();
  return false;
}

bool FileOutput::open(const std::string& path) {
  drop();
  failure_.clear();
  if (path.empty() || path.find('\0') != std::string::npos) return fail("not a file name", 0);
  struct stat st {};
  // What the name finally refers to, as the system follows it (through
  // links such as /dev/stdout to a pipe, which name no file): anything but
  // a regular file is written in place under the name given.
  if (::stat(path.c_str(), &st) == 0 && !S_ISREG(st.st_mode)) {
    if (S_ISDIR(st.st_mode)) return fail("cannot write", EISDIR);
    target_ = path;
    owned_ = true;
    fd_ = ::open(path.c_str(), O_WRONLY | O_CLOEXEC | O_NOCTTY);
    return fd_ >= 0 || fail("cannot open", errno);
  }
  bool exists = false;
  if (const int err = resolve(path, target_, st, exists)) return fail("cannot open", err);
  owned_ = true;
  if (exists && !S_ISREG(st.st_mode)) return fail("cannot write", EEXIST);  // changed meanwhile
  fd_ = create_beside(folder_of(target_), temporary_);
  if (fd_ < 0) {
    temporary_.clear();
    return fail("cannot create a temporary file beside it", errno);
  }
  if (exists) {
    // Owner first: changing it may clear the set-user-ID and set-group-ID bits.
    if (::fchown(fd_, st.st_uid, st.st_gid) != 0)
      (void)::fchown(fd_, static_cast<uid_t>(-1), st.st_gid);
    if (::fchmod(fd_, st.st_mode & 07777) != 0) return fail("cannot keep its permissions", errno);
  }
  return true;
}

bool FileOutput::open_descriptor(int fd) {
  drop();
  failure_.clear();
  fd_ = fd;
  return true;
}

bool FileOutput::write_all(std::string_view bytes) {
  std::size_t done = 0;
  while (done < bytes.size()) {
    const ssize_t n = ::write(fd_, bytes.data() + done, bytes.size() - done);
    if (n < 0) {
      if (errno == EINTR) continue;
      return fail("write failed", errno);
    }
    done += static_cast<std::size_t>(n);
  }
  return true;
}

bool FileOutput::flush() {
  const bool ok = write_all(buffer_);
  buffer_.clear();
  return ok;
}

bool FileOutput::write(std::string_view bytes) {
  if (fd_ < 0) return fail("not open for writing", 0);
  if (buffer_.size() + bytes.size() <= kBufferBytes) {
    if (buffer_.capacity() < kBufferBytes) buffer_.reserve(kBufferBytes);
    buffer_.append(bytes);
    return true;
  }
  if (!flush()) return false;
  if (bytes.size() >= kBufferBytes) return write_all(bytes);  // large pieces go out without a copy
  buffer_.append(bytes);
  return true;
}

bool FileOutput::write(std::span<const Byte> bytes) {
  return write(std::string_view(reinterpret_cast<const char*>(bytes.data()), bytes.size()));
}

bool FileOutput::commit() {
  if (fd_ < 0) return fail("not open for writing", 0);
  if (!flush()) return false;
  if (temporary_.empty()) {
    const bool closed = !owned_ || ::close(fd_) == 0;
    const int err = errno;
    fd_ = -1;
    owned_ = false;
    return closed || fail("close failed", err);
  }
  if (::fsync(fd_) != 0) return fail("cannot flush to the disk", errno);
  const int closed = ::close(fd_);
  fd_ = -1;
  if (closed != 0) return fail("close failed", errno);
  if (::rename(temporary_.c_str(), target_.c_str()) != 0) return fail("cannot replace", errno);
  temporary_.clear();
  owned_ = false;
  // The rename is durable only once the directory is on the disk too. Some
  // file systems cannot sync a directory (EINVAL): the rename stands.
  const int dir = ::open(folder_of(target_).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
  if (dir < 0) return fail("replaced, but its folder cannot be synced", errno);
  const bool synced = ::fsync(dir) == 0 || errno == EINVAL;
  const int err = errno;
  ::close(dir);
  return synced || fail("replaced, but its folder cannot be synced", err);
}

}  // namespace kvdata
