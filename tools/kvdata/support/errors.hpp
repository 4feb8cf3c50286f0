#pragma once
// The two ways a kvdata command fails, and the exit code of each. Commands
// raise them anywhere; main() turns them into a message on standard error and
// the exit code, so each command's failure policy lives in one place.
//
//   if (!file) bad_input(path + ": cannot open: " + reason);
//   if (kind_unknown) bad_usage("unknown KIND \"" + word + "\"");

#include <stdexcept>
#include <string>

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

}  // namespace kvdata::cli
