#include "spectra/lcms_context.hpp"

#include <cctype>

namespace kvdata::cli {
namespace {

// "<file>: Line 12, <text>" as "line 12: <text>", in the command's words.
std::string explain(std::string message) {
  while (!message.empty() && std::isspace(static_cast<unsigned char>(message.back()))) {
    message.pop_back();
  }
  std::string where;
  const std::size_t at = message.find(": Line ");
  if (at != std::string::npos) {
    const std::size_t digits = at + 7;
    std::size_t end = digits;
    while (end < message.size() && std::isdigit(static_cast<unsigned char>(message[end]))) ++end;
    if (end > digits && message.compare(end, 2, ", ") == 0) {
      where = "line " + message.substr(digits, end - digits) + ": ";
      message.erase(0, end + 2);
    }
  }
  // Little CMS's words for a table it cannot hold.
  if (message == "AllocateDataSet: too much data") {
    message = "the table has more sets or fields than the " + std::to_string(kCgatsMostSets) +
              " that Little CMS reads; CSV has no such limit";
  } else if (message == "AllocateDataFormat: Unknown NUMBER_OF_FIELDS") {
    message = "NUMBER_OF_FIELDS must come before BEGIN_DATA_FORMAT";
  }
  return where + message;
}

}  // namespace

LcmsContext::LcmsContext() : context_(cmsCreateContext(nullptr, this)) {
  if (context_ != nullptr) cmsSetLogErrorHandlerTHR(context_, &LcmsContext::collect);
}

LcmsContext::~LcmsContext() {
  if (context_ != nullptr) cmsDeleteContext(context_);
}

void LcmsContext::collect(cmsContext context, cmsUInt32Number /*code*/, const char* text) {
  auto* self = static_cast<LcmsContext*>(cmsGetContextUserData(context));
  if (self == nullptr || text == nullptr) return;
  self->messages_.emplace_back(text);
}

std::string LcmsContext::explained() const {
  std::string all;
  for (const std::string& m : messages_) all += (all.empty() ? "" : "; ") + explain(m);
  return all;
}

}  // namespace kvdata::cli
