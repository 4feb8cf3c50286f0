#include "json/fields.hpp"

#include <algorithm>
#include <limits>

#include "kvdata/automation/text.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {

namespace {

// Appends the start of `j`'s text to `out`, stopping soon after `out` holds
// `room` characters: a value of any size or depth costs only what is shown.
void brief(const Json& j, std::string& out, std::size_t room) {
  if (j.is_string()) {
    const auto& s = j.get_ref<const std::string&>();
    out += Json(s.substr(0, room + 1)).dump();
    return;
  }
  if (!j.is_structured()) {
    out += j.dump();
    return;
  }
  out += j.is_array() ? '[' : '{';
  bool first = true;
  for (auto it = j.begin(); it != j.end(); ++it) {
    if (out.size() > room) return;
    if (!first) out += ',';
    first = false;
    if (j.is_object()) out += Json(it.key().substr(0, room + 1)).dump() + ':';
    brief(*it, out, room);
  }
  out += j.is_array() ? ']' : '}';
}

}  // namespace

std::string describe(const Json& j) {
  std::string text;
  brief(j, text, kShownChars);
  if (text.size() > kShownChars) text = text.substr(0, kShownChars - 3) + "...";
  return text;
}

Fields::Fields(const Json& j, std::string path) : j_(j), path_(std::move(path)) {
  if (!j_.is_object()) bad_input(path_ + ": expected an object {...}, found " + describe(j_));
}

std::string Fields::at(std::string_view name) const {
  return path_.empty() ? std::string(name) : path_ + "." + std::string(name);
}

const Json* Fields::find(std::string_view name) {
  const auto it = j_.find(name);
  if (it == j_.end()) return nullptr;
  seen_.emplace_back(name);
  return &*it;
}

const Json& Fields::get(std::string_view name) {
  const Json* j = find(name);
  if (j == nullptr) bad_input(at(name) + ": missing");
  return *j;
}

void Fields::done() const {
  for (const auto& [key, value] : j_.items()) {
    if (std::find(seen_.begin(), seen_.end(), key) == seen_.end()) {
      bad_input(at(shortened(key)) + ": unknown field");
    }
  }
}

std::string element(std::string_view path, long long index) {
  std::string s(path);
  s += '(';
  s += std::to_string(index);
  s += ')';
  return s;
}

String read_string(const Json& j, std::string_view path) {
  if (!j.is_string()) bad_input(std::string(path) + ": expected text, found " + describe(j));
  return from_utf8(j.get_ref<const std::string&>());
}

namespace {

template <class I>
I read_int(const Json& j, std::string_view path, const char* type) {
  const bool integral = j.is_number_integer();
  if (integral) {
    if (j.is_number_unsigned()) {
      const auto v = j.get<unsigned long long>();
      if (v <= static_cast<unsigned long long>(std::numeric_limits<I>::max())) {
        return static_cast<I>(v);
      }
    } else {
      const auto v = j.get<long long>();
      if (v >= std::numeric_limits<I>::min() && v <= std::numeric_limits<I>::max()) {
        return static_cast<I>(v);
      }
    }
  }
  bad_input(std::string(path) + ": expected " + type + ", found " + describe(j));
}

}  // namespace

Long read_long(const Json& j, std::string_view path) {
  return read_int<Long>(j, path, "a whole number from -2147483648 to 2147483647 (Long)");
}

Integer read_integer(const Json& j, std::string_view path) {
  return read_int<Integer>(j, path, "a whole number from -32768 to 32767 (Integer)");
}

bool read_bool(const Json& j, std::string_view path) {
  if (!j.is_boolean())
    bad_input(std::string(path) + ": expected true or false, found " + describe(j));
  return j.get<bool>();
}

const Json& read_array(const Json& j, std::string_view path, std::size_t n) {
  if (!j.is_array())
    bad_input(std::string(path) + ": expected an array [...], found " + describe(j));
  if (n != 0 && j.size() != n) {
    bad_input(std::string(path) + ": expected " + std::to_string(n) + " values, found " +
              std::to_string(j.size()));
  }
  return j;
}

Json string_to_json(const String& s) {
  return to_utf8(s);
}

}  // namespace kvdata::cli
