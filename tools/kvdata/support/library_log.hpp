#pragma once
// Collects the library's event-log entries (field-codec failures) while a
// stream is read or written, so that a refusal can say what the library
// found, instead of the entries going to the system log.
//
//   LibraryLog log;
//   bool ok = reader(...);
//   if (!ok) bad_input("refused" + log.summary());

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

  const std::vector<std::string>& entries() const { return entries_; }
  // "" when nothing was logged, else "; the library logged: <first entry>"
  // (and how many more).
  std::string summary() const;

 private:
  EventLog::Sink previous_;
  std::vector<std::string> entries_;
};

}  // namespace kvdata::cli
