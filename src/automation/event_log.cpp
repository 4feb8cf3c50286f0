#include "kvdata/automation/event_log.hpp"

#include <syslog.h>

#include <memory>
#include <mutex>
#include <string>
#include <utility>

#include "kvdata/automation/text.hpp"

namespace kvdata {
namespace {

// The one replaceable destination of event-log entries and the lock that
// orders them. The lock is recursive so that a sink may itself write or set
// the sink; the sink is held by a shared pointer so that one replaced from
// inside itself lives until it returns.
struct Destination {
  std::recursive_mutex lock;
  std::shared_ptr<EventLog::Sink> sink;
};

// Never destroyed, so that entries written while the program exits (from
// other threads or static destructors) still find it.
Destination& destination() {
  static Destination& d = *new Destination;
  return d;
}

bool is_high_surrogate(char16_t c) {
  return c >= 0xD800 && c <= 0xDBFF;
}

// The text cut to kMaxEntryUnits with its marker, or the text itself when it
// fits. A surrogate pair is never split.
String bounded(const String& text) {
  if (text.size() <= EventLog::kMaxEntryUnits) return text;
  const std::string count = std::to_string(text.size());
  String marker = u" [... cut from ";
  marker.append(count.begin(), count.end());
  marker += u" units]";
  std::size_t keep = EventLog::kMaxEntryUnits - marker.size();
  if (is_high_surrogate(text[keep - 1])) --keep;
  String cut = text.substr(0, keep);
  cut += marker;
  return cut;
}

// One syslog line: the library's name first, line breaks folded.
std::string syslog_line(const String& text) {
  String line = u"KVData: ";
  line.reserve(line.size() + text.size());
  for (std::size_t i = 0; i < text.size(); ++i) {
    const char16_t c = text[i];
    if (c == u'\r' || c == u'\n') {
      line += u" / ";
      if (c == u'\r' && i + 1 < text.size() && text[i + 1] == u'\n') ++i;
    } else {
      line += c;
    }
  }
  return to_utf8(line);
}

}  // namespace

void EventLog::Write(const String& text) {
  const String entry = bounded(text);
  Destination& d = destination();
  const std::lock_guard hold(d.lock);
  if (const std::shared_ptr<Sink> sink = d.sink) {
    (*sink)(entry);
  } else {
    // Level only: the facility and identity stay the host's.
    syslog(LOG_ERR, "%s", syslog_line(entry).c_str());
  }
}

EventLog::Sink EventLog::SetSink(Sink sink) {
  std::shared_ptr<Sink> next = sink ? std::make_shared<Sink>(std::move(sink)) : nullptr;
  Destination& d = destination();
  const std::lock_guard hold(d.lock);
  const std::shared_ptr<Sink> previous = std::exchange(d.sink, std::move(next));
  return previous ? *previous : Sink{};
}

}  // namespace kvdata
