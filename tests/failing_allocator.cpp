// The replaced global operator new / delete behind fail_allocations: the
// plain, array and nothrow forms, so that every one of them pairs malloc
// with free (the sanitizers check the pairing); the aligned forms keep
// their own.
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
void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  try {
    return allocate(size);
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}
void* operator new[](std::size_t size, const std::nothrow_t& tag) noexcept {
  return operator new(size, tag);
}
void operator delete(void* p, const std::nothrow_t&) noexcept { std::free(p); }
void operator delete[](void* p, const std::nothrow_t&) noexcept { std::free(p); }
