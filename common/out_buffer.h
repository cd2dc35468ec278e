// A growable output buffer for workers whose result size is known only
// roughly in advance: reserved once from the input, never zero-filled, grown
// geometrically (rarely) when the estimate is short. Vector kernels write
// straight into the room past size() and then commit what they wrote.
//
// The result limit (0x7FFFFFFF bytes unless a smaller one is given): room is
// never granted past limit + kSlack, and every request for room is either
// exact or at most kSlack bytes, so a refused request means the result has
// passed the limit; fits() tells the same at the end. The writer then gives
// its empty result. The slack lets kernels write whole blocks and fixed-size
// stores near the end; the host never sees more than limit bytes.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <new>
#include <string_view>

#include "common/size_gate.h"

namespace zul {

class out_buffer {
 public:
  // Largest request for room that may exceed what will be written.
  static constexpr std::size_t kSlack = 16384;

  // Reserves min(reserve, limit + kSlack) bytes. Throws std::bad_alloc when
  // the memory cannot be had.
  explicit out_buffer(std::size_t reserve, std::uint64_t limit = kMaxResultBytes)
      : limit_(limit), cap_(limit + kSlack) {
    grow_to(reserve < cap_ ? reserve : static_cast<std::size_t>(cap_));
  }
  out_buffer(out_buffer&& other) noexcept
      : data_(other.data_),
        size_(other.size_),
        capacity_(other.capacity_),
        limit_(other.limit_),
        cap_(other.cap_) {
    other.data_ = nullptr;
    other.size_ = other.capacity_ = 0;
  }
  out_buffer(const out_buffer&) = delete;
  out_buffer& operator=(const out_buffer&) = delete;
  out_buffer& operator=(out_buffer&&) = delete;
  ~out_buffer() { std::free(data_); }

  std::size_t size() const noexcept { return size_; }
  const std::uint8_t* data() const noexcept { return data_; }
  // The result's bytes, for a second pass in place.
  std::uint8_t* data() noexcept { return data_; }
  std::string_view view() const noexcept { return {reinterpret_cast<const char*>(data_), size_}; }
  // The result, for builders and comparisons that take a string view.
  operator std::string_view() const noexcept { return view(); }  // NOLINT: implicit on purpose
  friend bool operator==(const out_buffer& a, std::string_view b) noexcept { return a.view() == b; }

  // True while the result is within the limit.
  bool fits() const noexcept { return size_ <= limit_; }
  // Forgets the result (the empty result of a writer that passed the limit).
  out_buffer&& discard() noexcept {
    size_ = 0;
    return static_cast<out_buffer&&>(*this);
  }

  // Makes room for extra more bytes (exact, or at most kSlack). False when
  // that would pass limit + kSlack, that is when the result has passed the
  // limit. Throws std::bad_alloc when memory runs out.
  [[nodiscard]] bool ensure(std::size_t extra) {
    if (extra <= capacity_ - size_) return true;
    if (extra > cap_ - size_) return false;
    const std::uint64_t want = std::uint64_t{size_} + extra;
    const std::uint64_t half_again = capacity_ + capacity_ / 2;
    const std::uint64_t grown = want > half_again ? want : half_again;
    grow_to(static_cast<std::size_t>(grown < cap_ ? grown : cap_));
    return true;
  }
  std::size_t room() const noexcept { return capacity_ - size_; }

  // The first free byte; at least the room last ensured is writable.
  std::uint8_t* tail() noexcept { return data_ + size_; }
  // Counts n bytes written at tail() as part of the result.
  void commit(std::size_t n) noexcept { size_ += n; }

  // Grows the result by n bytes that the caller then writes at the returned
  // pointer: for results whose size is known up front (reserve it in the
  // constructor and this costs no allocation). Throws std::bad_alloc when n
  // would pass limit + kSlack.
  std::uint8_t* extend(std::size_t n) {
    if (!ensure(n)) throw std::bad_alloc();
    std::uint8_t* at = data_ + size_;
    size_ += n;
    return at;
  }

  // Appends n bytes; the room must have been ensured.
  void put(const void* bytes, std::size_t n) noexcept {
    if (n != 0) std::memcpy(data_ + size_, bytes, n);
    size_ += n;
  }
  void put(std::string_view s) noexcept { put(s.data(), s.size()); }
  void put_byte(std::uint8_t b) noexcept { data_[size_++] = b; }

 private:
  void grow_to(std::size_t capacity) {
    void* p = std::realloc(data_, capacity == 0 ? 1 : capacity);
    if (p == nullptr) throw std::bad_alloc();
    data_ = static_cast<std::uint8_t*>(p);
    capacity_ = capacity;
  }

  std::uint8_t* data_ = nullptr;
  std::size_t size_ = 0;
  std::size_t capacity_ = 0;
  std::uint64_t limit_;
  std::uint64_t cap_;
};

}  // namespace zul
