// The size gate for results handed to the host. A host string holds at most
// 0x7FFFFFFF bytes, and a longer result would only be thrown away by the
// result builder, so it is never built: sizes are computed in 64 bits with
// overflow checks before anything is allocated, and output that grows while
// it is written stops as soon as it would pass the limit. Every check here
// is pure arithmetic on sizes; nothing allocates except make_room, which
// grows a buffer the caller owns.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>

namespace zul {

// The longest result, in bytes, that the host accepts.
inline constexpr std::uint64_t kMaxResultBytes = 0x7FFFFFFF;

// True when a result of n bytes may be built.
constexpr bool fits_result(std::uint64_t n, std::uint64_t limit = kMaxResultBytes) noexcept {
  return n <= limit;
}

// A result size known before the result is built: a sum of parts and
// repeated parts. Once the running total passes the limit (or a product or
// sum would overflow 64 bits) the size is over for good; the total kept is
// then meaningless and fits() is false.
class result_size {
 public:
  constexpr explicit result_size(std::uint64_t limit = kMaxResultBytes) noexcept : limit_(limit) {}

  // Adds n bytes.
  constexpr result_size& add(std::uint64_t n) noexcept {
    if (over_ || n > limit_ - total_) {
      over_ = true;
    } else {
      total_ += n;
    }
    return *this;
  }

  // Adds count parts of each bytes (count * each, checked).
  constexpr result_size& add_times(std::uint64_t count, std::uint64_t each) noexcept {
    if (each != 0 && count > (limit_ - total_) / each) {
      over_ = true;
      return *this;
    }
    return add(count * each);
  }

  constexpr bool fits() const noexcept { return !over_; }
  // The total in bytes; 0 when the size does not fit.
  constexpr std::size_t bytes() const noexcept {
    return over_ ? 0 : static_cast<std::size_t>(total_);
  }

 private:
  std::uint64_t limit_;
  std::uint64_t total_ = 0;
  bool over_ = false;
};

// The room to reserve, once, for output of at most count * each + extra
// units that stops at limit units: that worst case, capped at the limit
// (checked, so no product overflows). Writers reserve it up front and then
// never grow: room that is reserved but never written is never touched, so
// it costs address space rather than memory, and a buffer that never grows
// is never copied (growing a 1 GiB buffer to 2 GiB holds 3 GiB at once).
constexpr std::size_t worst_case_reserve(std::uint64_t count, std::uint64_t each,
                                         std::uint64_t extra, std::uint64_t limit) noexcept {
  const result_size worst = result_size(limit).add_times(count, each).add(extra);
  return static_cast<std::size_t>(worst.fits() ? worst.bytes() : limit);
}

// The growing-output budget. Makes room in out (a std::string or
// std::vector) for n more units before they are appended: true when
// out.size() + n stays within limit units, after growing the capacity
// geometrically but never past limit (so the buffer itself never exceeds
// the limit); false, with out unchanged, when the output would pass the
// limit. The writer then stops and gives its empty result. The common case
// (room already there) is one comparison.
template <class Buffer>
bool make_room(Buffer& out, std::size_t n, std::uint64_t limit) {
  const std::size_t size = out.size();
  if (n <= out.capacity() - size) return size + n <= limit;
  if (n > limit || size > limit - n) return false;
  const std::uint64_t doubled = 2 * static_cast<std::uint64_t>(out.capacity());
  const auto target =
      static_cast<std::size_t>(std::min(limit, std::max<std::uint64_t>(doubled, size + n)));
  // A fresh buffer of exactly the target: reserve() on a string that is
  // already large may round up to twice its old capacity, past the limit.
  Buffer grown;
  grown.reserve(target);
  grown.insert(grown.end(), out.begin(), out.end());
  out.swap(grown);
  return true;
}

}  // namespace zul
