// Counting kernels: occurrences of one byte, and non-overlapping
// occurrences of a longer pattern (leftmost match first, the scan resumes
// after each match). One table per instruction-set level, chosen once per
// process; tests and benchmarks run every level the machine has.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

#include "common/dispatch.h"

namespace zul::search::detail {

struct count_kernels {
  // Bytes of [p, p + n) equal to b.
  std::uint64_t (*count_byte)(const std::uint8_t* p, std::size_t n, std::uint8_t b) noexcept;
  // Non-overlapping occurrences of find[0..m) in [p, p + n); m >= 2.
  std::uint64_t (*count_pattern)(const std::uint8_t* p, std::size_t n, const std::uint8_t* find,
                                 std::size_t m) noexcept;
};

const simd::family_tables<count_kernels>& count_tables() noexcept;
const count_kernels& active_count_kernels() noexcept;

// The scalar path, also the tail of the vector kernels: counts the
// occurrences that start at or after `from`, none of them before
// `next`, the first start allowed by the non-overlapping rule.
std::uint64_t count_pattern_from(const std::uint8_t* p, std::size_t n, const std::uint8_t* find,
                                 std::size_t m, std::size_t from, std::size_t next) noexcept;

// Checks one block's candidates in order: each set bit of `candidates`
// marks the position base + (bit index >> shift) (shift 2 where a compare
// mask gives four bits a byte); a position before `next` overlaps the last
// match and is skipped, the others are compared in full.
inline void check_candidates(std::uint64_t candidates, unsigned shift, std::size_t base,
                             const std::uint8_t* p, const std::uint8_t* find, std::size_t m,
                             std::size_t& next, std::uint64_t& count) noexcept {
  while (candidates != 0) {
    const std::size_t pos = base + (static_cast<std::size_t>(__builtin_ctzll(candidates)) >> shift);
    candidates &= candidates - 1;
    if (pos < next) continue;
    if (m <= 2 || std::memcmp(p + pos + 1, find + 1, m - 2) == 0) {
      ++count;
      next = pos + m;
    }
  }
}

std::uint64_t count_byte_scalar(const std::uint8_t* p, std::size_t n, std::uint8_t b) noexcept;
std::uint64_t count_byte_sse2(const std::uint8_t* p, std::size_t n, std::uint8_t b) noexcept;
std::uint64_t count_byte_avx2(const std::uint8_t* p, std::size_t n, std::uint8_t b) noexcept;
std::uint64_t count_byte_avx512(const std::uint8_t* p, std::size_t n, std::uint8_t b) noexcept;
std::uint64_t count_byte_neon(const std::uint8_t* p, std::size_t n, std::uint8_t b) noexcept;
std::uint64_t count_pattern_scalar(const std::uint8_t* p, std::size_t n, const std::uint8_t* find,
                                   std::size_t m) noexcept;
std::uint64_t count_pattern_sse2(const std::uint8_t* p, std::size_t n, const std::uint8_t* find,
                                 std::size_t m) noexcept;
std::uint64_t count_pattern_avx2(const std::uint8_t* p, std::size_t n, const std::uint8_t* find,
                                 std::size_t m) noexcept;
std::uint64_t count_pattern_avx512(const std::uint8_t* p, std::size_t n, const std::uint8_t* find,
                                   std::size_t m) noexcept;
std::uint64_t count_pattern_neon(const std::uint8_t* p, std::size_t n, const std::uint8_t* find,
                                 std::size_t m) noexcept;

}  // namespace zul::search::detail
