#pragma once
// The command's inputs and outputs. "-" names standard input as an input and
// standard output as an output, for every subcommand. Every output file is
// written by the library's FileOutput policy (kvdata/streams/file_output.hpp):
// a regular file is replaced only once the whole result was written, keeping
// its permissions; a link is followed; a device or FIFO is written in place.
// A signal (SIGINT, SIGTERM, SIGHUP) removes the temporary file before the
// command exits with 128 + the signal's number.
//
//   refuse_output_among_inputs(o.output, {file});   // before anything is read
//   ByteArray bytes = read_byte_array(file);
//   write_output(o.output, text);                   // "-" or empty: standard output

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <span>
#include <string>
#include <string_view>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/streams/file_output.hpp"

namespace kvdata::cli {

// Removes the output's temporary file on SIGINT, SIGTERM and SIGHUP before
// the command exits with 128 + the signal's number. Installed once by main().
void install_signal_cleanup();

// UsageError when an output is the same file (device and inode, links
// followed) as one of the inputs, or when standard input is named twice.
// Called before anything is read, so no input is lost to its own output.
void refuse_output_among_inputs(std::initializer_list<std::string> outputs,
                                std::initializer_list<std::string> inputs);

// The file's bytes as a stream with indices 0..n-1, read straight into the
// array. InputError naming the file when it is missing, unreadable, a
// directory, or longer than any stream can be (beyond the highest Long; a
// regular file is refused from its size before anything is read).
// With `most`, only the file's first `most` bytes are kept, and `whole`
// receives the file's size: a regular file is read no further, standard
// input or a pipe is read to its end and counted.
ByteArray read_byte_array(const std::string& path, std::size_t most = SIZE_MAX,
                          std::size_t* whole = nullptr);
// The most of a text file that is read whole (a CGATS file, which Little
// CMS parses in memory): about 100,000 spectra.
inline constexpr std::size_t kMaxWholeTextBytes = std::size_t{64} << 20;

// The file's text. Same failures, and InputError when it is longer than
// `max_bytes` (refused from a regular file's size before it is read).
std::string read_text(const std::string& path, std::size_t max_bytes = kMaxWholeTextBytes);
// The InputError of a text longer than `max_bytes`.
[[noreturn]] void text_too_long(const std::string& path, std::size_t max_bytes);

// A file opened for reading piece by piece, closed with the object ("-":
// standard input, left open). The same failures as read_byte_array, from the
// constructor and from read().
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

// Output written piece by piece ("" or "-": standard output). Bytes written
// to standard output stay written; a file is finished only by commit(), and
// an output dropped without it leaves its target as it was. InputError
// naming the target and the reason from every member.
class OutputFile {
 public:
  explicit OutputFile(const std::string& path);
  ~OutputFile();
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;
  void write(std::string_view text);
  void commit();

 private:
  [[noreturn]] void fail();

  // Forgets the temporary file for the signal handler, after out_ is gone.
  struct Registration {
    Registration() = default;
    ~Registration();
    Registration(const Registration&) = delete;
    Registration& operator=(const Registration&) = delete;
  };

  std::string name_;  // for messages
  Registration registration_;
  FileOutput out_;
};

// The whole of `content` to `path` ("" or "-": standard output).
void write_output(const std::string& path, std::string_view content);
void write_output(const std::string& path, std::span<const Byte> content);

}  // namespace kvdata::cli
