// Stream files: a byte stream kept in a file as its raw bytes, no header.
// Saving follows FileOutput's policy (a regular file is replaced whole, so
// the name always holds either the earlier file or the whole new stream).
// Files are closed on every path by their owning handle.

#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <memory>
#include <span>
#include <string>
#include <system_error>

#include "automation/detail/failure.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/streams/file_output.hpp"
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

bool save(const String& filename, const ByteArray& bytes) {
  if (bytes.rank() != 1) return false;
  const std::string target = native_name(filename);
  if (target.empty()) return false;
  FileOutput out;
  return out.open(target) && out.write(std::span<const Byte>(bytes.data(), bytes.size())) &&
         out.commit();
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
