// A set of byte values prepared once, and a search for the first byte of a
// buffer that belongs to it. The set is stored as two 16-byte nibble tables
// (rows[h >> 3][l] has bit h & 7 set when byte h * 16 + l is a member), which
// is both the 256-bit membership and what the vector kernels shuffle: any set
// size costs the same constant work per block. The set also keeps up to
// kMaxRanges byte ranges whose union it is, for the SSE2 level, which has
// no byte shuffle and tests each range with a compare instead (from SSSE3
// on, the kernels shuffle). Stable
// interface: the search families and the encoders' "next byte that needs
// work" scans call it.
#pragma once

#include <cstddef>
#include <cstdint>

#include "common/bytes.h"
#include "common/dispatch.h"

namespace zul::simd {

class byte_set {
 public:
  constexpr byte_set() = default;

  // Adds one byte value, or the inclusive range first..last (nothing when
  // first > last).
  constexpr void add(std::uint8_t b) noexcept {
    if (contains(b)) return;
    set_bit(b);
    // Extend a range that b touches, joining it with a range it then
    // touches, else start one (ranges from add_range may overlap; only
    // their union matters).
    for (std::size_t r = 0; r < range_count_ && r < kMaxRanges; ++r) {
      if (b + 1 == first_[r] || b == last_[r] + 1) {
        if (b < first_[r]) first_[r] = b;
        if (b > last_[r]) last_[r] = b;
        join(r);
        return;
      }
    }
    push_range(b, b);
  }
  constexpr void add_range(std::uint8_t first, std::uint8_t last) noexcept {
    if (first > last) return;
    for (unsigned b = first; b <= last; ++b) set_bit(static_cast<std::uint8_t>(b));
    push_range(first, last);
  }

  constexpr bool contains(std::uint8_t b) const noexcept {
    return (rows_[b >> 7][b & 15] >> ((b >> 4) & 7)) & 1;
  }

  // Nibble tables for the kernels: low(l) is the row of bytes 0x00..0x7F
  // with low nibble l, high(l) the row of bytes 0x80..0xFF.
  const std::uint8_t* low_rows() const noexcept { return rows_[0]; }
  const std::uint8_t* high_rows() const noexcept { return rows_[1]; }

  // Ranges first(r)..last(r), r < range_count(), whose union is the set;
  // range_count() is above kMaxRanges when the set needs more of them.
  static constexpr std::size_t kMaxRanges = 8;
  constexpr std::size_t range_count() const noexcept { return range_count_; }
  constexpr std::uint8_t first(std::size_t r) const noexcept { return first_[r]; }
  constexpr std::uint8_t last(std::size_t r) const noexcept { return last_[r]; }

 private:
  constexpr void set_bit(std::uint8_t b) noexcept {
    rows_[b >> 7][b & 15] |= static_cast<std::uint8_t>(1u << ((b >> 4) & 7));
  }
  // Merges into range r the first other range that touches or overlaps it
  // (one byte just added can bridge at most that one gap).
  constexpr void join(std::size_t r) noexcept {
    if (range_count_ > kMaxRanges) return;
    for (std::size_t s = 0; s < range_count_; ++s) {
      if (s == r || first_[s] > last_[r] + 1 || first_[r] > last_[s] + 1) continue;
      if (first_[s] < first_[r]) first_[r] = first_[s];
      if (last_[s] > last_[r]) last_[r] = last_[s];
      --range_count_;
      first_[s] = first_[range_count_];
      last_[s] = last_[range_count_];
      return;
    }
  }
  constexpr void push_range(std::uint8_t first, std::uint8_t last) noexcept {
    if (range_count_ < kMaxRanges) {
      first_[range_count_] = first;
      last_[range_count_] = last;
    }
    if (range_count_ <= kMaxRanges) ++range_count_;
  }

  alignas(16) std::uint8_t rows_[2][16] = {};
  std::uint8_t first_[kMaxRanges] = {};
  std::uint8_t last_[kMaxRanges] = {};
  std::size_t range_count_ = 0;
};

// The set of the given byte values (repeats are harmless; empty gives the
// empty set).
byte_set make_byte_set(bytes_view members) noexcept;

// Index of the first byte of [p, p + n) that belongs to set, or n when none
// does (also for n == 0, where p may be null). Reads no byte outside the
// range.
std::size_t find_first_in_set(const byte_set& set, const std::uint8_t* p, std::size_t n) noexcept;

inline std::size_t find_first_in_set(const byte_set& set, bytes_view bytes) noexcept {
  return find_first_in_set(set, bytes.data(), bytes.size());
}

// Code-point lanes (UTF-32 text) against a byte set: lane c is a member when
// the set holds min(c, 255). One set thus says which characters below U+0080
// need work and, through 255 (with 128..254 alike), whether all characters
// from U+0080 up do. Index of the first member lane of [p, p + n), or n.
std::size_t find_first_code_point_in_set(const byte_set& set, const std::uint32_t* p,
                                         std::size_t n) noexcept;

namespace detail {

// One kernel per level; tests and benchmarks run each of them.
struct byte_set_kernels {
  std::size_t (*find_first)(const byte_set& set, const std::uint8_t* p, std::size_t n) noexcept;
  // find_first_code_point_in_set for one level.
  std::size_t (*find_first_code_point)(const byte_set& set, const std::uint32_t* p,
                                       std::size_t n) noexcept;
  // The same search that also narrows: lanes [0, k) before the first member
  // k are written to out as the bytes min(c, 255). out must have room for
  // n + 64 bytes; bytes past out[k - 1] are left unspecified.
  std::size_t (*narrow_until_member)(const byte_set& set, const std::uint32_t* p, std::size_t n,
                                     std::uint8_t* out) noexcept;
};
const family_tables<byte_set_kernels>& byte_set_tables() noexcept;

// The per-level kernels, defined in byte_set_x86.cpp and byte_set_neon.cpp.
std::size_t find_first_in_set_scalar(const byte_set& set, const std::uint8_t* p,
                                     std::size_t n) noexcept;
std::size_t find_first_in_set_sse2(const byte_set& set, const std::uint8_t* p,
                                   std::size_t n) noexcept;
std::size_t find_first_in_set_ssse3(const byte_set& set, const std::uint8_t* p,
                                    std::size_t n) noexcept;
std::size_t find_first_in_set_avx2(const byte_set& set, const std::uint8_t* p,
                                   std::size_t n) noexcept;
std::size_t find_first_in_set_avx512(const byte_set& set, const std::uint8_t* p,
                                     std::size_t n) noexcept;
std::size_t find_first_in_set_neon(const byte_set& set, const std::uint8_t* p,
                                   std::size_t n) noexcept;
std::size_t find_first_code_point_scalar(const byte_set& set, const std::uint32_t* p,
                                         std::size_t n) noexcept;
std::size_t find_first_code_point_avx2(const byte_set& set, const std::uint32_t* p,
                                       std::size_t n) noexcept;
std::size_t find_first_code_point_avx512(const byte_set& set, const std::uint32_t* p,
                                         std::size_t n) noexcept;
std::size_t find_first_code_point_neon(const byte_set& set, const std::uint32_t* p,
                                       std::size_t n) noexcept;
std::size_t narrow_until_member_scalar(const byte_set& set, const std::uint32_t* p, std::size_t n,
                                       std::uint8_t* out) noexcept;
std::size_t narrow_until_member_avx2(const byte_set& set, const std::uint32_t* p, std::size_t n,
                                     std::uint8_t* out) noexcept;
std::size_t narrow_until_member_avx512(const byte_set& set, const std::uint32_t* p, std::size_t n,
                                       std::uint8_t* out) noexcept;

std::size_t narrow_until_member_neon(const byte_set& set, const std::uint32_t* p, std::size_t n,
                                     std::uint8_t* out) noexcept;

}  // namespace detail
}  // namespace zul::simd
