#pragma once
// Writing a file without ever harming it: the one policy by which
// `Streams::StreamSave` and every output of the kvdata command put bytes in
// a file.
//
//   FileOutput out;
//   if (!out.open("user.kvs") || !out.write(bytes) || !out.commit()) report(out.failure());
//
// What the name refers to decides how it is written:
// - A regular file, or a name that does not exist yet, is replaced whole.
//   The bytes go to a new temporary file beside it (a hidden name of fixed,
//   short length, so any valid target name has one), which is flushed to the
//   disk, renamed over the target and the directory synced. Until then the
//   target keeps its earlier content; a failure or an output dropped without
//   commit() removes the temporary file. The replacement keeps the replaced
//   file's permission bits, and its owner and group where the process may
//   set them; a new file gets 0666 under the umask.
// - A symbolic link is followed, link after link: the file it finally names
//   is replaced as above, and the link stays a link.
// - Anything else that exists (a device, a FIFO, a socket) is opened and
//   written in place, never removed or replaced: `/dev/null` stays a device,
//   a FIFO's reader gets the bytes.
// - A directory is refused.
//
// The temporary file's name is available while it exists (temporary()), so
// that a program can remove it when a signal ends it.

#include <cstddef>
#include <span>
#include <string>
#include <string_view>

#include "kvdata/automation/types.hpp"

namespace kvdata {

class FileOutput {
 public:
  FileOutput() = default;
  // An output not committed is dropped: its temporary file is removed and
  // the target left as it was (bytes already written in place stay).
  ~FileOutput();
  FileOutput(const FileOutput&) = delete;
  FileOutput& operator=(const FileOutput&) = delete;

  // Starts writing `path` by the policy above. False, with failure() set,
  // when it cannot: an empty name, a directory, a missing folder, no right
  // to create the temporary file or to open the target.
  [[nodiscard]] bool open(const std::string& path);
  // Writes to an open descriptor in place (standard output: 1); the
  // descriptor stays open and belongs to the caller.
  [[nodiscard]] bool open_descriptor(int fd);

  // Appends bytes. Small pieces are gathered and written in large blocks.
  // False, with failure() set, when the system refuses them; the output is
  // then dropped.
  [[nodiscard]] bool write(std::string_view bytes);
  [[nodiscard]] bool write(std::span<const Byte> bytes);

  // Writes what is gathered and finishes: a replacement is flushed to the
  // disk and renamed over the target, then the directory is synced. False,
  // with failure() set, on any failure; a target being replaced is then
  // left as it was.
  [[nodiscard]] bool commit();

  // What went wrong and why, without the file's name
  // ("cannot create a temporary file beside it: Permission denied").
  const std::string& failure() const { return failure_; }
  // The temporary file being written; empty when there is none (before
  // open(), after commit(), or when the target is written in place).
  const std::string& temporary() const { return temporary_; }

 private:
  bool fail(const std::string& what, int err);
  bool flush();
  bool write_all(std::string_view bytes);
  void drop();

  std::string target_;     // the file replaced at commit() (links resolved)
  std::string temporary_;  // the file being written when replacing
  std::string failure_;
  std::string buffer_;
  int fd_ = -1;
  bool owned_ = false;  // fd_ is closed by this object
};

}  // namespace kvdata
