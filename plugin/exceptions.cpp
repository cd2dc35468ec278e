// RaiseException and the shared trap's mapping from C++ exceptions to host
// exception classes. The order of the checks matters: out_of_range is a
// logic_error and the range, overflow and underflow errors are
// runtime_errors, so the specific kinds are tried first.
#include "plugin/exceptions.h"

#include <cstring>
#include <new>
#include <stdexcept>
#include <typeinfo>

#include "plugin/host_services.h"
#include "plugin/results.h"

void RaiseException(const char* class_name, const char* message, std::uint32_t error_number) {
  REALstring text = nullptr;
  if (message) {
    text = REALBuildUnicodeString(message, static_cast<std::int64_t>(std::strlen(message)),
                                  text_encoding::kUTF8);
  }
  REALobject exception = REALnewInstance(class_name);
  if (!exception) exception = REALnewInstance("RuntimeException");
  if (exception) {
    REALSetPropValueString(exception, "Message", text);
    REALSetPropValueInteger(exception, "ErrorNumber", error_number);
    REALRaiseException(exception);
    REALUnlockObject(exception);
  }
  if (text) REALUnlockString(text);
}

TrappedError map_current_exception() noexcept {
  // Rethrowing the exception being handled allocates nothing (unlike
  // rethrowing an exception_ptr), and every message is static text or the
  // exception's own what() text, so the mapping works with no memory left.
  constexpr const char* kOutOfBounds = "OutOfBoundsException";
  constexpr const char* kRuntime = "RuntimeException";
  try {
    throw;
  } catch (const std::bad_alloc&) {
    return {"OutOfMemoryException", "Failed to allocate memory."};
  } catch (const std::range_error& e) {
    return {kOutOfBounds, e.what()};
  } catch (const std::out_of_range& e) {
    return {kOutOfBounds, e.what()};
  } catch (const std::overflow_error& e) {
    return {kOutOfBounds, e.what()};
  } catch (const std::underflow_error& e) {
    return {kOutOfBounds, e.what()};
  } catch (const std::logic_error& e) {
    return {kRuntime, e.what()};
  } catch (const std::runtime_error& e) {
    return {kRuntime, e.what()};
  } catch (const std::bad_cast& e) {
    return {"IllegalCastException", e.what()};
  } catch (const std::exception& e) {
    return {kRuntime, e.what()};
  } catch (...) {
    return {kRuntime, "Sorry, but there was an unnamed C++ Exception."};
  }
}

void raise_current_exception() noexcept {
  const TrappedError mapped = map_current_exception();
  try {
    RaiseException(mapped.class_name, mapped.message, 0);
  } catch (...) {
    // The wrappers call the host's C services and throw nothing themselves;
    // this only keeps a failure inside them from reaching the host.
  }
}
