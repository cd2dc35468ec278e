// The replaced global operator new / delete behind fail_allocations. Only
// the plain and array forms are replaced; the library's defaults of the
// nothrow forms call them, and the aligned forms keep their own pairing.
#include "tests/failing_allocator.h"

#include <cstdlib>
#include <new>

namespace {
thread_local int failing = 0;

void* allocate(std::size_t size) {
  if (failing > 0) throw std::bad_alloc();
  if (void* p = std::malloc(size ? size : 1)) return p;
  throw std::bad_alloc();
}
}  // namespace

namespace zul::testing {
fail_allocations::fail_allocations() { ++failing; }
fail_allocations::~fail_allocations() { --failing; }
}  // namespace zul::testing

void* operator new(std::size_t size) { return allocate(size); }
void* operator new[](std::size_t size) { return allocate(size); }
void operator delete(void* p) noexcept { std::free(p); }
void operator delete[](void* p) noexcept { std::free(p); }
void operator delete(void* p, std::size_t) noexcept { std::free(p); }
void operator delete[](void* p, std::size_t) noexcept { std::free(p); }
