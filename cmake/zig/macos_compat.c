/* Linked into the macOS x86-64 library only. libc++'s aligned operator new
 * calls aligned_alloc, which libSystem has only from macOS 10.15; the
 * library promises 10.13, so a hidden aligned_alloc built on posix_memalign
 * (macOS 10.6) answers those calls inside the library. The assembler name
 * keeps the SDK's availability-annotated declaration out of the way. */
#include <stddef.h>

int posix_memalign(void** memptr, size_t alignment, size_t size);
__attribute__((visibility("hidden"))) void* zul_aligned_alloc(size_t alignment, size_t size)
    __asm__("_aligned_alloc");

void* zul_aligned_alloc(size_t alignment, size_t size) {
  void* p = NULL;
  if (alignment < sizeof(void*)) alignment = sizeof(void*);
  return posix_memalign(&p, alignment, size) == 0 ? p : NULL;
}
