#include "kvdata/automation/event_log.hpp"

#include <syslog.h>

#include <utility>

#include "kvdata/automation/text.hpp"

namespace kvdata {
namespace {

// The one replaceable destination of event-log entries.
EventLog::Sink& current_sink() {
  static EventLog::Sink sink;
  return sink;
}

void write_to_syslog(const String& text) {
  openlog("KVData", LOG_PID, LOG_USER);
  syslog(LOG_ERR, "%s", to_utf8(text).c_str());
}

}  // namespace

void EventLog::Write(const String& text) {
  const Sink& sink = current_sink();
  if (sink) {
    sink(text);
  } else {
    write_to_syslog(text);
  }
}

EventLog::Sink EventLog::SetSink(Sink sink) {
  return std::exchange(current_sink(), std::move(sink));
}

}  // namespace kvdata
