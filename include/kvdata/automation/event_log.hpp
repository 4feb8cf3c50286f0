#pragma once
// The system's application event log: one entry of type error per call.
//
//   auto previous = kvdata::EventLog::SetSink([&](const kvdata::String& t) { seen.push_back(t); });
//   kvdata::EventLog::SetSink(previous);   // restore

#include <functional>

#include "kvdata/automation/types.hpp"

namespace kvdata {

class EventLog {
 public:
  using Sink = std::function<void(const String& text)>;

  // Writes one entry of type error. By default it goes to syslog (level
  // error, identity "KVData"); a sink set with SetSink receives it instead.
  static void Write(const String& text);

  // Replaces the destination and returns the previous one. An empty sink
  // restores the system log.
  static Sink SetSink(Sink sink);
};

}  // namespace kvdata
