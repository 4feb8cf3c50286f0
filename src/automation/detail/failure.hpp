#pragma once
// The one boundary of every operation that reports failure by its result
// (False, a status code, ErrMsg, an event-log entry): what it catches and
// what each caught failure becomes.
//
//   return detail::false_on_failure([&] { ...; return put_block(...); });
//   return detail::on_failure(keep_message, [&] { ...; return true; });

#include <exception>
#include <new>
#include <stdexcept>

#include "kvdata/automation/error.hpp"

namespace kvdata::detail {

// Runs `body` and returns its result. A failure that it raises is handed to
// `handle(number, error)`, and handle's result is returned instead:
//  - a kvdata::Error: its number, and the error itself;
//  - memory exhaustion (std::bad_alloc, or std::length_error for a size no
//    container can hold): error 7, no error object;
//  - any other std::exception (a file system or random-device error from
//    the standard library, or one from an object of the caller's own behind
//    an interface): error 51, no error object.
// No error object is built on the way, so the boundary itself never needs
// memory. Nothing that derives from std::exception gets past it; should
// `handle` itself raise, that passes to the caller.
template <class Handle, class Body>
auto on_failure(const Handle& handle, const Body& body) -> decltype(body()) {
  try {
    return body();
  } catch (const Error& e) {
    return handle(e.number(), &e);
  } catch (const std::bad_alloc&) {
    return handle(kOutOfMemory, nullptr);
  } catch (const std::length_error&) {
    return handle(kOutOfMemory, nullptr);
  } catch (const std::exception&) {
    return handle(kInternalError, nullptr);
  }
}

// The "catch and return False" policy: any failure `body` raises is False.
template <class Body>
bool false_on_failure(const Body& body) {
  return on_failure([](Long, const Error*) { return false; }, body);
}

}  // namespace kvdata::detail
