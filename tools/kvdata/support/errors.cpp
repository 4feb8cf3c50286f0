#include "support/errors.hpp"

namespace kvdata::cli {

void bad_input(const std::string& message) {
  throw InputError(message);
}
void bad_usage(const std::string& message) {
  throw UsageError(message);
}

}  // namespace kvdata::cli
