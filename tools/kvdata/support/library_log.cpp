#include "support/library_log.hpp"

#include "kvdata/automation/text.hpp"

namespace kvdata::cli {
namespace {

// The entry without its final line break, its other lines indented to go
// under the first.
std::string indented(const String& text) {
  std::string entry;
  for (const char c : to_utf8(text)) {
    if (c == '\r') continue;
    entry += c;
    if (c == '\n') entry += "    ";
  }
  while (!entry.empty() && (entry.back() == ' ' || entry.back() == '\n')) entry.pop_back();
  return entry;
}

}  // namespace

LibraryLog::LibraryLog()
    : previous_(EventLog::SetSink([this](const String& text) { entries_.push_back(text); })) {}

LibraryLog::~LibraryLog() {
  EventLog::SetSink(previous_);
}

void LibraryLog::keep() {
  if (previous_) {
    for (const String& entry : entries_) previous_(entry);
  }
  entries_.clear();
}

RunLog::RunLog()
    : previous_(
          EventLog::SetSink([this](const String& text) { entries_.push_back(indented(text)); })) {}

RunLog::~RunLog() {
  EventLog::SetSink(previous_);
}

std::string RunLog::folded(bool verbose) const {
  if (entries_.empty()) return "";
  if (!verbose) {
    return "  (the library logged " + std::to_string(entries_.size()) +
           (entries_.size() == 1 ? " entry" : " entries") + "; -v shows them)\n";
  }
  std::string text;
  for (const std::string& entry : entries_) text += "  the library logged: " + entry + "\n";
  return text;
}

}  // namespace kvdata::cli
