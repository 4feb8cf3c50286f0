#include "support/errors.hpp"

#include <algorithm>
#include <cstring>
#include <exception>
#include <utility>

namespace kvdata::cli {
namespace {

thread_local const Activity* g_activity = nullptr;
// What the activity left by an exception was doing, kept without allocating
// (the exception may be that memory ran out).
thread_local char g_left[256] = "";

}  // namespace

void bad_input(const std::string& message) {
  throw InputError(message);
}
void bad_usage(const std::string& message) {
  throw UsageError(message);
}

std::string shortened(std::string_view value) {
  if (value.size() <= kShownChars) return std::string(value);
  std::size_t cut = kShownChars;
  while (cut > 0 && (static_cast<unsigned char>(value[cut]) & 0xC0) == 0x80) --cut;
  std::string s(value.substr(0, cut));
  return s.append("... (").append(std::to_string(value.size())).append(" bytes)");
}

std::string quote(std::string_view value) {
  std::string q("\"");
  if (value.size() <= kShownChars) return q.append(value).append("\"");
  const std::string cut = shortened(value);
  const std::size_t dots = cut.rfind("... (");
  return q.append(cut, 0, dots).append("\"").append(cut, dots);
}

Activity::Activity(std::string what)
    : what_(std::move(what)), outer_(g_activity), exceptions_(std::uncaught_exceptions()) {
  g_activity = this;
  g_left[0] = '\0';
}

Activity::~Activity() {
  if (std::uncaught_exceptions() > exceptions_ && g_left[0] == '\0') {
    const std::size_t n = std::min(what_.size(), sizeof g_left - 1);
    std::memcpy(g_left, what_.data(), n);
    g_left[n] = '\0';
  }
  g_activity = outer_;
}

std::string Activity::current() {
  if (g_left[0] != '\0') return g_left;
  return g_activity == nullptr ? std::string() : g_activity->what_;
}

}  // namespace kvdata::cli
