// Stream files: a byte stream kept in a file as its raw bytes, no header.
// Saving writes a temporary file beside the target and renames it over the
// target, so the name always holds either the earlier file or the whole new
// stream. Files are closed on every path by their owning handle.

#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <memory>
#include <random>
#include <string>
#include <system_error>
#include <utility>

#if __has_include(<unistd.h>)
#include <unistd.h>
#define KVDATA_HAVE_FSYNC 1
#endif

#include "automation/detail/failure.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/streams/streams.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata {
namespace {

struct FileCloser {
  void operator()(std::FILE* file) const { std::fclose(file); }
};
using File = std::unique_ptr<std::FILE, FileCloser>;

// The file name as the file system takes it; empty for a name that cannot
// name a file (empty, or holding U+0000).
std::string native_name(const String& filename) {
  if (filename.empty() || filename.find(u'\0') != String::npos) return {};
  return to_utf8(filename);
}

// Creates a new, exclusively owned file in the directory of `target` (so
// that renaming it over the target stays within one file system) and opens
// it for binary writing; its name is returned in `name`. The name is short,
// so a target whose own name is near the length limit still gets one. Null
// when none could be made.
File create_beside(const std::string& target, std::string& name) {
  const std::filesystem::path directory = std::filesystem::path(target).parent_path();
  std::random_device entropy;
  for (int attempt = 0; attempt < 16; ++attempt) {
    const std::string leaf = ".kvdata~" + std::to_string(entropy()) + ".tmp";
    name = (directory / leaf).string();
    if (std::FILE* file = std::fopen(name.c_str(), "wbx")) return File(file);
    if (errno != EEXIST) break;
  }
  name.clear();
  return nullptr;
}

// Writes all of `bytes` to `file`, pushes them to the device and closes it.
// True only when every step succeeded; the file is closed either way.
bool write_and_close(File file, const ByteArray& bytes) {
  const std::size_t n = bytes.size();
  bool ok = n == 0 || std::fwrite(bytes.data(), 1, n, file.get()) == n;
  ok = ok && std::fflush(file.get()) == 0;
#ifdef KVDATA_HAVE_FSYNC
  ok = ok && ::fsync(::fileno(file.get())) == 0;
#endif
  return std::fclose(file.release()) == 0 && ok;
}

bool save(const String& filename, const ByteArray& bytes) {
  if (bytes.rank() != 1) return false;
  const std::string target = native_name(filename);
  if (target.empty()) return false;
  std::string temporary;
  File file = create_beside(target, temporary);
  if (!file) return false;
  if (write_and_close(std::move(file), bytes) &&
      std::rename(temporary.c_str(), target.c_str()) == 0) {
    return true;
  }
  std::remove(temporary.c_str());
  return false;
}

bool load(const String& filename, ByteArray& bytes) {
  const std::string name = native_name(filename);
  if (name.empty()) return false;
  std::error_code ec;
  if (!std::filesystem::is_regular_file(name, ec)) return false;
  const File file(std::fopen(name.c_str(), "rb"));
  if (!file) return false;
  if (std::fseek(file.get(), 0, SEEK_END) != 0) return false;
  const long length = std::ftell(file.get());
  if (length <= 0 || length > detail::kLongMax) return false;  // empty files load nothing
  if (std::fseek(file.get(), 0, SEEK_SET) != 0) return false;
  ByteArray loaded(1, static_cast<Long>(length));
  const auto n = static_cast<std::size_t>(length);
  if (std::fread(loaded.data(), 1, n, file.get()) != n) return false;
  bytes = std::move(loaded);
  return true;
}

}  // namespace

bool Streams::StreamSave(const String& Filename, const ByteArray& a) {
  return detail::false_on_failure([&] { return save(Filename, a); });
}

bool Streams::StreamLoad(const String& Filename, ByteArray& a) {
  return detail::false_on_failure([&] { return load(Filename, a); });
}

}  // namespace kvdata
