// Byte-set search kernel for arm64 (NEON is part of the architecture). The
// same nibble-table method as the x86-64 kernels: TBL yields 0 for an index
// of 16 or more, so masking the index with 0x8F keeps the low nibble and
// selects the half of the byte values (0x00..0x7F or 0x80..0xFF) that holds v.
#include "common/byte_set.h"

#if defined(__aarch64__)
#include <arm_neon.h>

namespace zul::simd::detail {

std::size_t find_first_in_set_neon(const byte_set& set, const std::uint8_t* p,
                                   std::size_t n) noexcept {
  if (n < 16) return find_first_in_set_scalar(set, p, n);
  const uint8x16_t low = vld1q_u8(set.low_rows());
  const uint8x16_t high = vld1q_u8(set.high_rows());
  static const std::uint8_t kBits[16] = {1, 2, 4, 8, 16, 32, 64, 128, 1, 2, 4, 8, 16, 32, 64, 128};
  const uint8x16_t bits = vld1q_u8(kBits);
  const uint8x16_t keep = vdupq_n_u8(0x8F), top = vdupq_n_u8(0x80);
  auto members = [&](uint8x16_t v) {
    const uint8x16_t row = vorrq_u8(vqtbl1q_u8(low, vandq_u8(v, keep)),
                                    vqtbl1q_u8(high, vandq_u8(veorq_u8(v, top), keep)));
    return vtstq_u8(row, vqtbl1q_u8(bits, vshrq_n_u8(v, 4)));
  };
  // Four bits per byte of the compare result, in byte order.
  auto nibble_mask = [](uint8x16_t m) {
    return vget_lane_u64(vreinterpret_u64_u8(vshrn_n_u16(vreinterpretq_u16_u8(m), 4)), 0);
  };
  std::size_t i = 0;
  for (; n - i >= 16; i += 16) {
    if (const std::uint64_t m = nibble_mask(members(vld1q_u8(p + i))))
      return i + static_cast<std::size_t>(__builtin_ctzll(m) >> 2);
  }
  if (i == n) return n;
  const std::uint64_t m = nibble_mask(members(vld1q_u8(p + n - 16)));
  return m ? n - 16 + static_cast<std::size_t>(__builtin_ctzll(m) >> 2) : n;
}

}  // namespace zul::simd::detail
#endif
