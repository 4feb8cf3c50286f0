#include "support/library_log.hpp"

#include "kvdata/automation/text.hpp"

namespace kvdata::cli {

LibraryLog::LibraryLog()
    : previous_(
          EventLog::SetSink([this](const String& text) { entries_.push_back(to_utf8(text)); })) {}

LibraryLog::~LibraryLog() {
  EventLog::SetSink(previous_);
}

std::string LibraryLog::summary() const {
  if (entries_.empty()) return "";
  std::string text = "; the library logged: " + entries_.front();
  while (!text.empty() && (text.back() == '\n' || text.back() == '\r')) text.pop_back();
  if (entries_.size() > 1) text += " (and " + std::to_string(entries_.size() - 1) + " more)";
  return text;
}

}  // namespace kvdata::cli
