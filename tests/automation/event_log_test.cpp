#include <gtest/gtest.h>
#include <syslog.h>

#include <cstdarg>
#include <cstdio>
#include <string>
#include <vector>

#include "kvdata/automation/event_log.hpp"

// This program stands in for the host's system log: what the library hands
// to syslog is recorded here instead of reaching the system.
namespace {
struct SystemLog {
  int openlog_calls = 0;
  int closelog_calls = 0;
  std::vector<int> priorities;
  std::vector<std::string> lines;
};
SystemLog system_log;

void record(int priority, const char* format, va_list args) {
  char line[65536];
  std::vsnprintf(line, sizeof line, format, args);
  system_log.priorities.push_back(priority);
  system_log.lines.emplace_back(line);
}
}  // namespace

extern "C" {
void openlog(const char*, int, int) {
  ++system_log.openlog_calls;
}
void closelog() {
  ++system_log.closelog_calls;
}
void syslog(int priority, const char* format, ...) {
  va_list args;
  va_start(args, format);
  record(priority, format, args);
  va_end(args);
}
// The name a fortified build calls syslog by.
void __syslog_chk(int priority, int, const char* format, ...) {
  va_list args;
  va_start(args, format);
  record(priority, format, args);
  va_end(args);
}
}

namespace kvdata {
namespace {

TEST(EventLog, SystemLogKeepsTheHostsIdentityAndGetsOneLinePerEntry) {
  system_log = {};
  EventLog::Write(u"Error in SUB LongFromArray\r\nsecond\nthird\rfourth \u00e9");
  EventLog::Write(u"plain");
  EXPECT_EQ(system_log.openlog_calls, 0);
  EXPECT_EQ(system_log.closelog_calls, 0);
  EXPECT_EQ(system_log.priorities, (std::vector<int>{LOG_ERR, LOG_ERR}));
  EXPECT_EQ(system_log.lines,
            (std::vector<std::string>{
                "KVData: Error in SUB LongFromArray / second / third / fourth \xc3\xa9",
                "KVData: plain"}));
}

TEST(EventLog, EntriesAreCutAtTheBoundWithAMarker) {
  constexpr std::size_t kMax = EventLog::kMaxEntryUnits;
  const String at_bound(kMax, u'x');
  const String ten_mb(10u << 20, u'y');
  String split_pair(kMax + 1, u'z');
  // A surrogate pair across the place where the cut falls.
  const String marker = u" [... cut from 2049 units]";
  split_pair[kMax - marker.size() - 1] = u'\xD83D';
  split_pair[kMax - marker.size()] = u'\xDE00';

  std::vector<String> seen;
  const auto previous = EventLog::SetSink([&](const String& t) { seen.push_back(t); });
  EventLog::Write(at_bound);
  EventLog::Write(ten_mb);
  EventLog::Write(split_pair);
  EventLog::SetSink(previous);

  ASSERT_EQ(seen.size(), 3u);
  EXPECT_EQ(seen[0], at_bound);
  const String cut_marker = u" [... cut from 10485760 units]";
  EXPECT_EQ(seen[1], String(kMax - cut_marker.size(), u'y') + cut_marker);
  EXPECT_EQ(seen[2], String(kMax - marker.size() - 1, u'z') + marker);
}

}  // namespace
}  // namespace kvdata
