#pragma once
// Whole-file input and all-or-nothing output. Output goes to a temporary file
// beside the target, which is renamed over the target only once everything
// was written, so a failed command never leaves a half-written or emptied
// output file behind.
//
//   std::vector<kvdata::Byte> bytes = read_bytes("tileset.kvs");
//   write_output("out.json", text);   // "-" or empty: standard output

#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata::cli {

// The file's bytes. A missing or unreadable file raises InputError naming it.
std::vector<Byte> read_bytes(const std::string& path);
// The file's bytes as a stream with indices 0..n-1, read straight into the
// array. Same failures as read_bytes.
ByteArray read_byte_array(const std::string& path);
// The file's text, as bytes. Same failures as read_bytes.
std::string read_text(const std::string& path);

// A file opened for reading piece by piece, closed with the object. The
// same failures as read_bytes, from the constructor and from read().
class InputFile {
 public:
  explicit InputFile(const std::string& path);
  ~InputFile();
  InputFile(const InputFile&) = delete;
  InputFile& operator=(const InputFile&) = delete;
  // Up to `room` bytes into `to`; 0 at the end of the file.
  std::size_t read(char* to, std::size_t room);
  // The file's size when it is a regular file, otherwise 0.
  std::size_t size() const { return size_; }

 private:
  std::string path_;
  int fd_ = -1;
  std::size_t size_ = 0;
};

// Replaces `path` with `content` atomically (temporary file, then rename).
// On failure the temporary file is removed, `path` is untouched and
// InputError names the file and the reason.
void write_atomically(const std::string& path, std::span<const Byte> content);
void write_atomically(const std::string& path, std::string_view content);

// `path` empty or "-": standard output; otherwise write_atomically.
void write_output(const std::string& path, std::string_view content);

}  // namespace kvdata::cli
