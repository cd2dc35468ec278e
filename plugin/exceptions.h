// Host exceptions and the two failure policies every native function uses.
// No exception may cross into the host (natives are noexcept), so each
// adapter runs its whole body inside exactly one of:
//   trapped(empty, body)  raise the mapped host exception, return empty;
//   quietly(empty, body)  return empty, raise nothing.
// Raising does not unwind: the host's raise service returns and the function
// goes on to return its empty result. Neither policy allocates once an
// exception has been caught, so a failure while memory is short still ends
// in the host exception or the empty result.
#pragma once

#include <cstdint>

// Raises a new exception of class_name (falling back to "RuntimeException"
// for a class the host does not know) with "Message" and "ErrorNumber" set.
// Without the host's instance or raise service nothing is raised.
void RaiseException(const char* class_name, const char* message, std::uint32_t error_number);

// What the trap raises for a caught exception. Both texts are static or
// point into the exception object being handled: nothing is allocated.
struct TrappedError {
  const char* class_name;
  const char* message;
};
// Maps the exception being handled to its host class and message, in the
// trap's order: bad_alloc, the range/out_of_range/overflow/underflow errors,
// other logic and runtime errors, bad_cast, other std::exceptions, anything
// else. Call only inside a catch handler; the message stays valid while the
// handler runs.
TrappedError map_current_exception() noexcept;
// Raises the host exception for the exception being handled (call in catch).
void raise_current_exception() noexcept;

// Policy for the functions that report failures: returns body(), or, when it
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

// Policy for the functions that report no failure: returns body(), or empty
// when it throws (a buffer that cannot be had), with no host exception.
template <class R, class Body>
R quietly(R empty, Body&& body) noexcept {
  try {
    return body();
  } catch (...) {
    return empty;
  }
}
