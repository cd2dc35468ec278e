// Relocatable output buffers ("handles") for the single-byte character-set
// conversions. A handle owns a block of bytes that may move when it grows;
// locking pins the block so that a pointer into it stays valid until the
// matching unlock. The calls play the roles of the classic Memory Manager's
// NewHandle, SetHandleSize, GetHandleSize, HLock, HUnlock and DisposeHandle.
// Failures are reported by results (null, false), never by exceptions, and
// no handle is shared between calls.
#pragma once

#include <cstddef>
#include <cstdint>

namespace zul::text {

// Largest size a handle may reach unless a smaller limit is asked for. Host
// strings hold at most 0x7FFFFFFF bytes, so a bigger buffer is never useful.
inline constexpr std::size_t kHandleLimit = 0x7FFFFFFF;

struct handle_block;
using handle = handle_block*;

// NewHandle: a handle of size bytes, unlocked, or null when size exceeds
// limit or the memory cannot be had. The bytes' contents are unspecified.
handle new_handle(std::size_t size, std::size_t limit = kHandleLimit) noexcept;

// SetHandleSize: changes the handle's size to size bytes, keeping the first
// min(old, new) bytes. Fails (returns false, handle unchanged) when size
// exceeds the handle's limit, when memory runs out, or when the block would
// have to move while it is locked. Growth reserves extra room geometrically,
// so growing in small steps costs amortised constant time per byte.
bool set_handle_size(handle h, std::size_t size) noexcept;

// GetHandleSize: the handle's size in bytes; 0 for null.
std::size_t get_handle_size(handle h) noexcept;

// HLock: pins the block and returns its first byte (null for null). Locks
// nest: the block moves again only after as many unlocks as locks.
std::uint8_t* lock_handle(handle h) noexcept;

// HUnlock: undoes one lock_handle; a handle that is not locked is unchanged.
void unlock_handle(handle h) noexcept;

// DisposeHandle: frees the handle and its block, locked or not; null is a
// no-op.
void dispose_handle(handle h) noexcept;

// Owns one handle and disposes of it on every path out of a scope.
class owned_handle {
 public:
  owned_handle() = default;
  explicit owned_handle(handle h) noexcept : h_(h) {}
  owned_handle(owned_handle&& other) noexcept : h_(other.h_) { other.h_ = nullptr; }
  owned_handle& operator=(owned_handle&& other) noexcept {
    if (this != &other) {
      dispose_handle(h_);
      h_ = other.h_;
      other.h_ = nullptr;
    }
    return *this;
  }
  owned_handle(const owned_handle&) = delete;
  owned_handle& operator=(const owned_handle&) = delete;
  ~owned_handle() { dispose_handle(h_); }

  handle get() const noexcept { return h_; }
  explicit operator bool() const noexcept { return h_ != nullptr; }
  std::size_t size() const noexcept { return get_handle_size(h_); }

 private:
  handle h_ = nullptr;
};

// Keeps a handle locked for the life of a scope; data() is the pinned block.
class handle_lock {
 public:
  explicit handle_lock(handle h) noexcept : h_(h), data_(lock_handle(h)) {}
  handle_lock(const handle_lock&) = delete;
  handle_lock& operator=(const handle_lock&) = delete;
  ~handle_lock() { unlock_handle(h_); }

  std::uint8_t* data() const noexcept { return data_; }

 private:
  handle h_;
  std::uint8_t* data_;
};

}  // namespace zul::text
