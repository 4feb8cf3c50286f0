#pragma once
// The system's application event log: one entry of type error per call.
//
//   auto previous = kvdata::EventLog::SetSink([&](const kvdata::String& t) { seen.push_back(t); });
//   kvdata::EventLog::SetSink(previous);   // restore

#include <cstddef>
#include <functional>

#include "kvdata/automation/types.hpp"

namespace kvdata {

// Threads: Write and SetSink may be called from any thread at any time.
// Entries reach the destination one at a time, in the order their writers
// took the log, and once SetSink has returned no entry goes to the sink it
// replaced. The sink runs on the writer's thread with the log held, so it
// needs no lock of its own for what it touches only from there; it may write
// entries or set the sink itself, but it must not wait for another thread
// that writes entries.
class EventLog {
 public:
  using Sink = std::function<void(const String& text)>;

  // The most UTF-16 units of one entry. A longer text is cut to fit and ends
  // with a marker that says how long it was: " [... cut from N units]". A
  // text within the bound is delivered exactly as given.
  static constexpr std::size_t kMaxEntryUnits = 2048;

  // Writes one entry of type error. By default it goes to syslog at level
  // error under the host process's own identity and facility (the library
  // never calls openlog), as one line that starts "KVData: ", with each line
  // break inside the text folded to " / "; a sink set with SetSink receives
  // the text itself instead. An exception the sink raises passes to the
  // caller.
  static void Write(const String& text);

  // Replaces the destination and returns the previous one. An empty sink
  // restores the system log.
  static Sink SetSink(Sink sink);
};

}  // namespace kvdata
