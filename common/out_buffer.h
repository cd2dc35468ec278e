// A growable output buffer for workers whose result size is known only
// roughly in advance: reserved once from the input, never zero-filled, grown
// geometrically (rarely) when the estimate is short, and never beyond the
// 0x7FFFFFFF bytes a host string can hold. Vector kernels write straight
// into the room past size() and then commit what they wrote.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <new>
#include <string_view>

namespace zul {

// Largest result a host string can hold.
inline constexpr std::size_t kResultLimit = 0x7FFFFFFF;

class out_buffer {
 public:
  // Reserves min(reserve, limit) bytes. Throws std::bad_alloc when the
  // memory cannot be had.
  explicit out_buffer(std::size_t reserve, std::size_t limit = kResultLimit) : limit_(limit) {
    grow_to(reserve < limit ? reserve : limit);
  }
  out_buffer(out_buffer&& other) noexcept
      : data_(other.data_), size_(other.size_), capacity_(other.capacity_), limit_(other.limit_) {
    other.data_ = nullptr;
    other.size_ = other.capacity_ = 0;
  }
  out_buffer(const out_buffer&) = delete;
  out_buffer& operator=(const out_buffer&) = delete;
  out_buffer& operator=(out_buffer&&) = delete;
  ~out_buffer() { std::free(data_); }

  std::size_t size() const noexcept { return size_; }
  std::size_t capacity() const noexcept { return capacity_; }
  const std::uint8_t* data() const noexcept { return data_; }
  std::string_view view() const noexcept { return {reinterpret_cast<const char*>(data_), size_}; }
  // The result, for builders and comparisons that take a string view.
  operator std::string_view() const noexcept { return view(); }  // NOLINT: implicit on purpose
  friend bool operator==(const out_buffer& a, std::string_view b) noexcept { return a.view() == b; }

  // Makes room for extra more bytes. Throws std::bad_alloc when the result
  // would pass the limit or memory runs out.
  void ensure(std::size_t extra) {
    if (extra <= capacity_ - size_) return;
    if (extra > limit_ - size_) throw std::bad_alloc();
    const std::size_t want = size_ + extra;
    const std::size_t half_again = capacity_ + capacity_ / 2;
    grow_to(want > half_again ? want : (half_again < limit_ ? half_again : limit_));
  }

  // The first free byte; at least the room last ensured is writable.
  std::uint8_t* tail() noexcept { return data_ + size_; }
  // Counts n bytes written at tail() as part of the result.
  void commit(std::size_t n) noexcept { size_ += n; }

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
  std::size_t limit_;
};

}  // namespace zul
