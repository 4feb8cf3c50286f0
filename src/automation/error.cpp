#include "kvdata/automation/error.hpp"

#include <string>
#include <utility>

#include "kvdata/automation/text.hpp"

namespace kvdata {
namespace {

// "Source: Description (error N)"; without a source, "Description (error N)".
std::string what_text(Long number, const String& source, const String& description) {
  std::string text;
  if (!source.empty()) text = to_utf8(source) + ": ";
  text += to_utf8(description);
  text += " (error " + std::to_string(number) + ")";
  return text;
}

}  // namespace

Error::Error(Long number, String source, String description)
    : number_(number),
      source_(std::move(source)),
      description_(std::move(description)),
      what_(what_text(number_, source_, description_)) {}

String standard_description(Long number) {
  switch (number) {
    case kInvalidProcedureCall:
      return u"Invalid procedure call or argument";
    case kOverflow:
      return u"Overflow";
    case kOutOfMemory:
      return u"Out of memory";
    case kSubscriptOutOfRange:
      return u"Subscript out of range";
    case kTypeMismatch:
      return u"Type mismatch";
    case kObjectNotSet:
      return u"Object variable or With block variable not set";
    case kInternalError:
      return u"Internal error";
    case kInvalidUseOfNull:
      return u"Invalid use of Null";
    case kCannotCreateObject:
      return u"Cannot create object";
    case kDuplicateKey:
      return u"This key is already associated with an element of this collection";
    default:
      return u"Application-defined or object-defined error";
  }
}

void raise(Long number, String source) {
  throw Error(number, std::move(source), standard_description(number));
}

void raise(Long number, String source, String description) {
  throw Error(number, std::move(source), std::move(description));
}

}  // namespace kvdata
