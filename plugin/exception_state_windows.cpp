// Windows builds link their own copy of the C++ runtime (libc++abi), which
// keeps each thread's exception state under a fiber-local key whose clean-up
// callback lies in the plug-in's code. Once a host unloads the plug-in, the
// system still calls that callback when a thread or the process ends, and
// jumps into unloaded memory. These two definitions take the runtime's place
// (the linker then leaves its own out): the state lives in plain thread-local
// storage, which needs no callback; a thread ends with its state empty, so
// there is nothing to clean up. Elsewhere the runtime already does this.
#include <cstddef>

#if defined(_WIN32) && defined(_LIBCPP_VERSION)

namespace {

// The runtime's per-thread record: the stack of caught exceptions, the count
// of uncaught ones, and a slot that only 32-bit ARM unwinding uses.
struct exception_globals {
  void* caught_exceptions;
  unsigned int uncaught_exceptions;
  void* propagating_exceptions;
};

thread_local exception_globals state{};

}  // namespace

extern "C" void* __cxa_get_globals() noexcept { return &state; }
extern "C" void* __cxa_get_globals_fast() noexcept { return &state; }

#endif
