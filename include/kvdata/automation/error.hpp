#pragma once
// Run-time errors: the automation error number, its source and its description.
//
//   try { arr(99); } catch (const kvdata::Error& e) { e.number(); }   // 9
//   kvdata::raise(kvdata::kSubscriptOutOfRange);

#include <exception>
#include <string>

#include "kvdata/automation/types.hpp"

namespace kvdata {

// The standard run-time error numbers that the library raises itself.
inline constexpr Long kInvalidProcedureCall = 5;
inline constexpr Long kOverflow = 6;
inline constexpr Long kOutOfMemory = 7;
inline constexpr Long kSubscriptOutOfRange = 9;
inline constexpr Long kTypeMismatch = 13;
inline constexpr Long kObjectNotSet = 91;
inline constexpr Long kInternalError = 51;
inline constexpr Long kInvalidUseOfNull = 94;
inline constexpr Long kCannotCreateObject = 429;
inline constexpr Long kDuplicateKey = 457;

// Source of errors that name no operation of their own.
inline constexpr char16_t kDefaultErrorSource[] = u"KVData";

// A thrown automation error. `what()` names all three in UTF-8, for logs and
// messages: "KVData.ILU_D6510.calcXYZ: Subscript out of range (error 9)".
class Error : public std::exception {
 public:
  Error(Long number, String source, String description);

  Long number() const { return number_; }
  const String& source() const { return source_; }
  const String& description() const { return description_; }
  const char* what() const noexcept override { return what_.c_str(); }

 private:
  Long number_;
  String source_;
  String description_;
  std::string what_;
};

// The usual description of a standard error number ("Subscript out of range"
// for 9); "Application-defined or object-defined error" for others.
String standard_description(Long number);

// Raises a standard run-time error with its usual description.
[[noreturn]] void raise(Long number, String source = kDefaultErrorSource);

// Raises an error with a description of the caller's own.
[[noreturn]] void raise(Long number, String source, String description);

}  // namespace kvdata
