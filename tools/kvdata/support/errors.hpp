#pragma once
// The two ways a kvdata command fails, and the exit code of each. Commands
// raise them anywhere; main() turns them into a message on standard error and
// the exit code, so each command's failure policy lives in one place.
//
//   if (!file) bad_input(path + ": cannot open: " + reason);
//   if (kind_unknown) bad_usage("unknown KIND \"" + word + "\"");

#include <cstddef>
#include <stdexcept>
#include <string>
#include <string_view>

namespace kvdata::cli {

inline constexpr int kExitOk = 0;
inline constexpr int kExitBadInput = 1;  // a file is missing, unreadable or holds bad data
inline constexpr int kExitBadUsage = 2;  // the command line asks for something impossible

// Bad input. The message names the file and the field or line.
class InputError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

// Bad usage: wrong or missing arguments, a KIND that cannot be told.
class UsageError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

[[noreturn]] void bad_input(const std::string& message);
[[noreturn]] void bad_usage(const std::string& message);

// The most characters of a value that a message shows.
inline constexpr std::size_t kShownChars = 80;

// A value from the input as a message quotes it: in double quotes, cut after
// kShownChars characters (never inside a UTF-8 sequence) with "..." and the
// value's whole length, so that a hostile value never makes a hostile
// message: quote("abc") == "\"abc\"".
std::string quote(std::string_view value);
// The same cut without the quotes, for names and paths built from the input.
std::string shortened(std::string_view value);

// Names what the command is reading while it lives, so that running out of
// memory is reported with the file and what was being read
// ("white.csv: reading the spectra: out of memory").
class Activity {
 public:
  explicit Activity(std::string what);
  ~Activity();
  Activity(const Activity&) = delete;
  Activity& operator=(const Activity&) = delete;
  // The innermost activity that an exception (running out of memory) left
  // last, or else the innermost one still going; empty when there is none.
  static std::string current();

 private:
  std::string what_;
  const Activity* outer_;
  int exceptions_;  // exceptions already in flight when it began
};

}  // namespace kvdata::cli
