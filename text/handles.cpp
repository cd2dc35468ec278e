// Handles as a heap record (block pointer, size, reserved capacity, limit,
// lock count) with the block from malloc/realloc. realloc may move the
// block, which is why growth past the reserve is refused while locked;
// growth within the reserve never moves it and is always allowed.
#include "text/handles.h"

#include <algorithm>
#include <cstdlib>
#include <new>

namespace zul::text {

struct handle_block {
  std::uint8_t* bytes = nullptr;
  std::size_t size = 0;
  std::size_t capacity = 0;
  std::size_t limit = 0;
  unsigned locks = 0;
};

handle new_handle(std::size_t size, std::size_t limit) noexcept {
  if (size > limit) return nullptr;
  auto* h = new (std::nothrow) handle_block;
  if (!h) return nullptr;
  // malloc(0) may give null; one byte keeps "no block" meaning "failure".
  h->bytes = static_cast<std::uint8_t*>(std::malloc(std::max<std::size_t>(size, 1)));
  if (!h->bytes) {
    delete h;
    return nullptr;
  }
  h->size = size;
  h->capacity = std::max<std::size_t>(size, 1);
  h->limit = limit;
  return h;
}

bool set_handle_size(handle h, std::size_t size) noexcept {
  if (!h || size > h->limit) return false;
  if (size <= h->capacity) {
    h->size = size;
    return true;
  }
  if (h->locks != 0) return false;
  // Reserve at least half again the old room so that a run of small
  // growth steps reallocates only O(log n) times.
  const std::size_t room = std::min(h->limit, std::max(size, h->capacity + h->capacity / 2));
  auto* grown = static_cast<std::uint8_t*>(std::realloc(h->bytes, room));
  if (!grown) return false;
  h->bytes = grown;
  h->capacity = room;
  h->size = size;
  return true;
}

std::size_t get_handle_size(handle h) noexcept { return h ? h->size : 0; }

std::uint8_t* lock_handle(handle h) noexcept {
  if (!h) return nullptr;
  ++h->locks;
  return h->bytes;
}

void unlock_handle(handle h) noexcept {
  if (h && h->locks != 0) --h->locks;
}

void dispose_handle(handle h) noexcept {
  if (!h) return;
  std::free(h->bytes);
  delete h;
}

}  // namespace zul::text
