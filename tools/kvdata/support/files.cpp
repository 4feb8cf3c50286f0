#include "support/files.hpp"

#include <fcntl.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstring>
#include <limits>
#include <vector>

#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

std::string reason(int err) {
  return std::strerror(err);
}

bool is_standard(const std::string& path) {
  return path == "-";
}

// The temporary file of the output being written, for the signal handler:
// a fixed buffer and a flag, which a handler may read safely.
char g_temporary[4096];
volatile std::sig_atomic_t g_has_temporary = 0;

constexpr int kCleanupSignals[] = {SIGINT, SIGTERM, SIGHUP};

extern "C" void remove_temporary_and_exit(int signal) {
  if (g_has_temporary != 0) ::unlink(g_temporary);
  ::_exit(128 + signal);
}

// Holds the cleanup signals back while it lives, so that a temporary file is
// never created or renamed without the handler knowing of it.
class SignalsHeld {
 public:
  SignalsHeld() {
    sigset_t set;
    sigemptyset(&set);
    for (const int s : kCleanupSignals) sigaddset(&set, s);
    pthread_sigmask(SIG_BLOCK, &set, &old_);
  }
  ~SignalsHeld() { pthread_sigmask(SIG_SETMASK, &old_, nullptr); }
  SignalsHeld(const SignalsHeld&) = delete;
  SignalsHeld& operator=(const SignalsHeld&) = delete;

 private:
  sigset_t old_;
};

void remember_temporary(const std::string& name) {
  if (name.empty() || name.size() >= sizeof g_temporary) return;
  g_has_temporary = 0;
  std::memcpy(g_temporary, name.c_str(), name.size() + 1);
  g_has_temporary = 1;
}

void forget_temporary() {
  g_has_temporary = 0;
}

}  // namespace

void install_signal_cleanup() {
  for (const int s : kCleanupSignals) {
    struct sigaction now {};
    struct sigaction before {};
    now.sa_handler = remove_temporary_and_exit;
    sigemptyset(&now.sa_mask);
    for (const int other : kCleanupSignals) sigaddset(&now.sa_mask, other);
    ::sigaction(s, nullptr, &before);
    if (before.sa_handler != SIG_IGN) ::sigaction(s, &now, nullptr);  // nohup stays obeyed
  }
}

void refuse_output_among_inputs(std::initializer_list<std::string> outputs,
                                std::initializer_list<std::string> inputs) {
  std::size_t standard_inputs = 0;
  for (const std::string& in : inputs) standard_inputs += is_standard(in) ? 1u : 0u;
  if (standard_inputs > 1) bad_usage("standard input (-) can be only one of the inputs");
  for (const std::string& out : outputs) {
    struct stat o {};
    if (out.empty()) continue;
    if ((is_standard(out) ? ::fstat(STDOUT_FILENO, &o) : ::stat(out.c_str(), &o)) != 0) continue;
    if (S_ISCHR(o.st_mode)) continue;  // a terminal or /dev/null may well be both
    for (const std::string& in : inputs) {
      struct stat i {};
      if ((is_standard(in) ? ::fstat(STDIN_FILENO, &i) : ::stat(in.c_str(), &i)) != 0) continue;
      if (i.st_dev == o.st_dev && i.st_ino == o.st_ino) {
        bad_usage((is_standard(out) ? std::string("standard output") : out) +
                  ": is also the input " +
                  (is_standard(in) ? std::string("(standard input)") : in) +
                  "; writing it would destroy what is to be read. Write to another file.");
      }
    }
  }
}

InputFile::InputFile(const std::string& path) : path_(path) {
  if (is_standard(path)) {
    path_ = "standard input";
    fd_ = STDIN_FILENO;
  } else {
    fd_ = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd_ < 0) bad_input(path + ": cannot open: " + reason(errno));
  }
  struct stat st {};
  const int err = ::fstat(fd_, &st) == 0 ? 0 : errno;
  if (err != 0 || S_ISDIR(st.st_mode)) {
    if (fd_ != STDIN_FILENO) ::close(fd_);
    bad_input(path_ +
              (err != 0 ? ": cannot read: " + reason(err) : ": is a directory, not a file"));
  }
  if (S_ISREG(st.st_mode)) size_ = static_cast<std::size_t>(st.st_size);
}

InputFile::~InputFile() {
  if (fd_ != STDIN_FILENO) ::close(fd_);
}

std::size_t InputFile::read(char* to, std::size_t room) {
  for (;;) {
    const ssize_t n = ::read(fd_, to, room);
    if (n >= 0) return static_cast<std::size_t>(n);
    if (errno != EINTR) bad_input(path_ + ": read error: " + reason(errno));
  }
}

ByteArray read_byte_array(const std::string& path, std::size_t most, std::size_t* whole) {
  constexpr auto kMaxStream = static_cast<std::size_t>(std::numeric_limits<Long>::max());
  const std::string name = is_standard(path) ? "standard input" : path;
  const auto too_long = [&](const std::string& size) {
    bad_input(name + ": is " + size + " bytes, longer than any stream can be (at most " +
              std::to_string(kMaxStream) + ")");
  };
  InputFile file(path);
  if (file.size() > kMaxStream) too_long(std::to_string(file.size()));
  const Activity reading(name + ": reading the stream");
  ByteArray bytes(0, -1);
  // One more than what is kept, so that the read that finds the end needs
  // no growth.
  bytes.reserve(std::min(file.size(), most) + 1);
  std::size_t size = 0;  // bytes of the file so far, kept or not
  char buf[1 << 16];
  for (;;) {
    const std::size_t n = file.read(buf, sizeof buf);
    if (n == 0) break;
    if (n > kMaxStream - size) too_long("more than " + std::to_string(kMaxStream));
    size += n;
    const auto kept = static_cast<std::size_t>(bytes.ubound() + 1);
    const std::size_t keep = std::min(n, most - kept);
    if (keep > 0) {
      bytes.redim_preserve(0, static_cast<Long>(kept + keep) - 1);
      std::memcpy(bytes.data() + kept, buf, keep);
    }
    // The rest of a regular file is known from its size; a pipe is counted.
    if (bytes.size() == most && whole != nullptr && file.size() > 0) {
      size = file.size();
      break;
    }
  }
  if (whole != nullptr) *whole = size;
  return bytes;
}

void text_too_long(const std::string& path, std::size_t max_bytes) {
  bad_input((is_standard(path) ? "standard input" : path) + ": is longer than the " +
            std::to_string(max_bytes >> 20) + " MB read whole; no measurement file is that large");
}

std::string read_text(const std::string& path, std::size_t max_bytes) {
  const std::string name = is_standard(path) ? "standard input" : path;
  const auto too_long = [&] { text_too_long(path, max_bytes); };
  InputFile file(path);
  if (file.size() > max_bytes) too_long();
  const Activity reading(name + ": reading the text");
  std::string text;
  text.reserve(file.size() + 1);
  char buf[1 << 16];
  while (const std::size_t n = file.read(buf, sizeof buf)) {
    if (n > max_bytes - text.size()) too_long();
    text.append(buf, n);
  }
  return text;
}

OutputFile::OutputFile(const std::string& path)
    : name_(path.empty() || is_standard(path) ? "standard output" : path) {
  if (path.empty() || is_standard(path)) {
    (void)out_.open_descriptor(STDOUT_FILENO);
    return;
  }
  const SignalsHeld held;
  if (!out_.open(path)) fail();
  remember_temporary(out_.temporary());
}

OutputFile::~OutputFile() = default;

OutputFile::Registration::~Registration() {
  forget_temporary();
}

void OutputFile::fail() {
  forget_temporary();
  bad_input(name_ + ": " + out_.failure());
}

void OutputFile::write(std::string_view text) {
  if (!out_.write(text)) fail();
}

void OutputFile::commit() {
  const SignalsHeld held;
  if (!out_.commit()) fail();
  forget_temporary();
}

void write_output(const std::string& path, std::string_view content) {
  OutputFile out(path);
  out.write(content);
  out.commit();
}

void write_output(const std::string& path, std::span<const Byte> content) {
  write_output(path,
               std::string_view(reinterpret_cast<const char*>(content.data()), content.size()));
}

}  // namespace kvdata::cli
