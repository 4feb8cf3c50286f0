#pragma once
// The library's event-log entries (field-codec failures) seen by the
// command. While a stream is read or written a LibraryLog collects them, so
// that trying a stream (as identification does) leaves no trace; a refusal
// keeps them for the run. The run's log gathers what is kept and what is
// logged outside any LibraryLog, and main() folds it under the command's
// own message: the entries themselves with -v, otherwise how many there are.
//
//   LibraryLog log;
//   if (!reader(...)) { log.keep(); bad_input("the reader refused the stream"); }

#include <string>
#include <vector>

#include "kvdata/automation/event_log.hpp"

namespace kvdata::cli {

class LibraryLog {
 public:
  LibraryLog();
  ~LibraryLog();
  LibraryLog(const LibraryLog&) = delete;
  LibraryLog& operator=(const LibraryLog&) = delete;

  // Hands the entries collected so far to the log that was in place before
  // (the run's log), once.
  void keep();

 private:
  EventLog::Sink previous_;
  std::vector<String> entries_;
};

// The run's log: installed by main() for the whole run.
class RunLog {
 public:
  RunLog();
  ~RunLog();
  RunLog(const RunLog&) = delete;
  RunLog& operator=(const RunLog&) = delete;

  // The lines to write under the command's message: nothing when the
  // library logged nothing; each entry ("  the library logged: ...") when
  // `verbose`; else one line that says how many there are and that -v shows
  // them.
  std::string folded(bool verbose) const;

 private:
  EventLog::Sink previous_;
  std::vector<std::string> entries_;
};

}  // namespace kvdata::cli
