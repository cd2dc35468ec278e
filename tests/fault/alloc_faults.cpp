// Allocation-failure injection, compiled only into the test copy of the
// plug-in (StringGlobalsZUL_faults), never into the shipped library. The
// link wraps malloc, calloc and realloc (--wrap), and operator new is
// replaced, so every allocation the library makes on the calling thread is
// counted; once armed, the k-th allocation fails (or every one from the
// k-th on), as a null pointer from the C functions and std::bad_alloc from
// operator new. Two exported functions arm the counter and read it.
#include <cstddef>
#include <cstdlib>
#include <new>

extern "C" {
void* __real_malloc(std::size_t size);
void* __real_calloc(std::size_t count, std::size_t size);
void* __real_realloc(void* p, std::size_t size);
}

namespace {

// Per thread, so calls on other threads are neither counted nor failed.
thread_local long allocations = 0;
thread_local long fail_at = 0;  // 0: count only
thread_local bool fail_from_on = false;

bool next_allocation_fails() {
  const long n = ++allocations;
  if (fail_at == 0) return false;
  return fail_from_on ? n >= fail_at : n == fail_at;
}

void* counted_new(std::size_t size) {
  void* p = next_allocation_fails() ? nullptr : __real_malloc(size ? size : 1);
  if (!p) throw std::bad_alloc();
  return p;
}

void* counted_new(std::size_t size, const std::nothrow_t&) noexcept {
  return next_allocation_fails() ? nullptr : __real_malloc(size ? size : 1);
}

}  // namespace

extern "C" {

void* __wrap_malloc(std::size_t size) {
  return next_allocation_fails() ? nullptr : __real_malloc(size);
}
void* __wrap_calloc(std::size_t count, std::size_t size) {
  return next_allocation_fails() ? nullptr : __real_calloc(count, size);
}
void* __wrap_realloc(void* p, std::size_t size) {
  return next_allocation_fails() ? nullptr : __real_realloc(p, size);
}

// Resets this thread's count; from the next allocation on, allocation k
// fails (every one from k on when from_on is not 0). k = 0 only counts.
__attribute__((visibility("default"))) void zul_fault_arm(long k, int from_on) {
  allocations = 0;
  fail_at = k;
  fail_from_on = from_on != 0;
}

// Allocations counted on this thread since the last zul_fault_arm.
__attribute__((visibility("default"))) long zul_fault_count() { return allocations; }

}  // extern "C"

void* operator new(std::size_t size) { return counted_new(size); }
void* operator new[](std::size_t size) { return counted_new(size); }
void* operator new(std::size_t size, const std::nothrow_t& tag) noexcept {
  return counted_new(size, tag);
}
void* operator new[](std::size_t size, const std::nothrow_t& tag) noexcept {
  return counted_new(size, tag);
}
void operator delete(void* p) noexcept { std::free(p); }
void operator delete[](void* p) noexcept { std::free(p); }
void operator delete(void* p, std::size_t) noexcept { std::free(p); }
void operator delete[](void* p, std::size_t) noexcept { std::free(p); }
void operator delete(void* p, const std::nothrow_t&) noexcept { std::free(p); }
void operator delete[](void* p, const std::nothrow_t&) noexcept { std::free(p); }
