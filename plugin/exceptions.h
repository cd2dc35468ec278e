// Host exceptions: RaiseException builds and raises one, and the shared trap
// turns any C++ exception thrown inside a function body into the matching
// host exception, so that no exception ever crosses into the host. Raising
// does not unwind: the host's raise service returns and the function goes on
// to return its empty result.
#pragma once

#include <cstdint>
#include <exception>
#include <string>

// Raises a new exception of class_name (falling back to "RuntimeException"
// for a class the host does not know) with "Message" and "ErrorNumber" set.
// Without the host's instance or raise service nothing is raised.
void RaiseException(const char* class_name, const char* message, std::uint32_t error_number);

// What the trap raises for a caught exception.
struct TrappedError {
  const char* class_name;
  std::string message;
};
// Maps an exception to its host class and message, in the trap's order:
// bad_alloc, the range/out_of_range/overflow/underflow errors, other logic and
// runtime errors, bad_cast, other std::exceptions, anything else.
TrappedError map_exception(std::exception_ptr error) noexcept;
// Raises the host exception for the exception being handled (call in catch).
void raise_current_exception() noexcept;

// The shared trap around a function body: returns body(), or, when it
// throws, raises the mapped host exception and returns empty. Holders and
// buffers local to body are released before the exception is raised.
template <class R, class Body>
R trapped(R empty, Body&& body) noexcept {
  try {
    return body();
  } catch (...) {
    raise_current_exception();
    return empty;
  }
}

// For functions that report no failure: returns body(), or empty when it
// throws (a buffer that cannot be had), with no host exception raised.
template <class R, class Body>
R quietly(R empty, Body&& body) noexcept {
  try {
    return body();
  } catch (...) {
    return empty;
  }
}
