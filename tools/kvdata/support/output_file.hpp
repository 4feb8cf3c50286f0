#pragma once
// Output written piece by piece, for commands that stream their results:
// text is gathered in a large buffer and handed to the system in big writes.
// A file target gets the same all-or-nothing treatment as write_atomically:
// everything goes to a temporary file beside the target, which replaces the
// target only at commit(); an output that is dropped without commit() (a
// failure part way) removes the temporary file and leaves the target as it
// was. Standard output cannot be taken back: what was written stays written.
//
//   OutputFile out(path);   // "" or "-": standard output
//   out.write(chunk_text);  ...;  out.commit();

#include <string>
#include <string_view>

namespace kvdata::cli {

class OutputFile {
 public:
  // Opens the temporary file beside `path` (InputError naming the target when
  // it cannot be made), or standard output for "" or "-" when
  // `dash_is_stdout`; otherwise "-" is a file of that name and "" bad usage.
  explicit OutputFile(const std::string& path, bool dash_is_stdout = true);
  ~OutputFile();
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;

  // Appends `text`. InputError when the system refuses the bytes.
  void write(std::string_view text);
  // Writes what is buffered and, for a file, flushes it to the disk and
  // renames it over the target. InputError on failure (the target is left
  // as it was).
  void commit();

 private:
  void flush();
  void write_all(std::string_view bytes);
  [[noreturn]] void fail(const std::string& what, int err);

  std::string path_;  // empty: standard output
  std::string temp_;
  int fd_ = -1;
  bool done_ = false;
  std::string buffer_;
};

}  // namespace kvdata::cli
