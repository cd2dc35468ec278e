// Counting kernels for arm64 (NEON is part of the architecture), the same
// methods as the x86-64 kernels: 8-bit lane counters summed every 255 rounds
// for one byte, and a first-byte and last-byte filter before the full check
// for longer patterns.
#include "search/count_kernels.h"

#if defined(__aarch64__)
#include <arm_neon.h>

#include <cstring>

namespace zul::search::detail {

std::uint64_t count_byte_neon(const std::uint8_t* p, std::size_t n, std::uint8_t b) noexcept {
  const uint8x16_t needle = vdupq_n_u8(b);
  std::uint64_t count = 0;
  std::size_t i = 0;
  while (n - i >= 64) {
    // Four independent counters, each bumped at most once per round.
    uint8x16_t c0 = vdupq_n_u8(0), c1 = c0, c2 = c0, c3 = c0;
    std::size_t rounds = (n - i) / 64;
    if (rounds > 255) rounds = 255;
    for (std::size_t k = 0; k < rounds; ++k, i += 64) {
      c0 = vsubq_u8(c0, vceqq_u8(vld1q_u8(p + i), needle));
      c1 = vsubq_u8(c1, vceqq_u8(vld1q_u8(p + i + 16), needle));
      c2 = vsubq_u8(c2, vceqq_u8(vld1q_u8(p + i + 32), needle));
      c3 = vsubq_u8(c3, vceqq_u8(vld1q_u8(p + i + 48), needle));
    }
    count += vaddlvq_u8(c0) + vaddlvq_u8(c1) + vaddlvq_u8(c2) + vaddlvq_u8(c3);
  }
  for (; n - i >= 16; i += 16) {
    count += vaddlvq_u8(vshrq_n_u8(vceqq_u8(vld1q_u8(p + i), needle), 7));
  }
  return count + count_byte_scalar(p + i, n - i, b);
}

std::uint64_t count_pattern_neon(const std::uint8_t* p, std::size_t n, const std::uint8_t* find,
                                 std::size_t m) noexcept {
  if (m > n) return 0;
  const uint8x16_t first = vdupq_n_u8(find[0]);
  const uint8x16_t last = vdupq_n_u8(find[m - 1]);
  std::uint64_t count = 0;
  std::size_t next = 0, i = 0;
  // Positions i..i+15 need bytes up to i + 15 + m - 1 < n.
  for (; i + 16 + m - 1 <= n; i += 16) {
    const uint8x16_t both =
        vandq_u8(vceqq_u8(vld1q_u8(p + i), first), vceqq_u8(vld1q_u8(p + i + m - 1), last));
    // Four bits per byte in byte order; one of them marks a candidate.
    std::uint64_t candidates =
        vget_lane_u64(vreinterpret_u64_u8(vshrn_n_u16(vreinterpretq_u16_u8(both), 4)), 0) &
        0x8888888888888888u;
    check_candidates(candidates, 2, i, p, find, m, next, count);
  }
  return count + count_pattern_from(p, n, find, m, i, next);
}

}  // namespace zul::search::detail
#endif
