// Byte-set search kernels for arm64 (NEON is part of the architecture). The
// same nibble-table method as the x86-64 kernels: TBL yields 0 for an index
// of 16 or more, so masking the index with 0x8F keeps the low nibble and
// selects the half of the byte values (0x00..0x7F or 0x80..0xFF) that holds v.
// Code-point lanes are narrowed to min(c, 255) by two saturating narrows.
#include "common/byte_set.h"

#if defined(__aarch64__)
#include <arm_neon.h>

namespace zul::simd::detail {
namespace {

struct tables {
  uint8x16_t low, high, bits, keep, top;
};

inline tables load_tables(const byte_set& set) {
  static const std::uint8_t kBits[16] = {1, 2, 4, 8, 16, 32, 64, 128, 1, 2, 4, 8, 16, 32, 64, 128};
  return {vld1q_u8(set.low_rows()), vld1q_u8(set.high_rows()), vld1q_u8(kBits), vdupq_n_u8(0x8F),
          vdupq_n_u8(0x80)};
}

// 0xFF in the lanes of v whose byte is a member.
inline uint8x16_t members(const tables& t, uint8x16_t v) {
  const uint8x16_t row = vorrq_u8(vqtbl1q_u8(t.low, vandq_u8(v, t.keep)),
                                  vqtbl1q_u8(t.high, vandq_u8(veorq_u8(v, t.top), t.keep)));
  return vtstq_u8(row, vqtbl1q_u8(t.bits, vshrq_n_u8(v, 4)));
}

// Four bits per byte of a compare result, in byte order.
inline std::uint64_t nibble_mask(uint8x16_t m) {
  return vget_lane_u64(vreinterpret_u64_u8(vshrn_n_u16(vreinterpretq_u16_u8(m), 4)), 0);
}

// 16 code-point lanes as the bytes min(c, 255), in order.
inline uint8x16_t narrow16(const std::uint32_t* p) {
  const uint16x8_t a = vcombine_u16(vqmovn_u32(vld1q_u32(p)), vqmovn_u32(vld1q_u32(p + 4)));
  const uint16x8_t b = vcombine_u16(vqmovn_u32(vld1q_u32(p + 8)), vqmovn_u32(vld1q_u32(p + 12)));
  return vcombine_u8(vqmovn_u16(a), vqmovn_u16(b));
}

template <bool kNarrow>
std::size_t code_points_neon(const byte_set& set, const std::uint32_t* p, std::size_t n,
                             std::uint8_t* out) noexcept {
  const tables t = load_tables(set);
  std::size_t i = 0;
  for (; n - i >= 16; i += 16) {
    const uint8x16_t v = narrow16(p + i);
    if (kNarrow) vst1q_u8(out + i, v);
    if (const std::uint64_t m = nibble_mask(members(t, v))) {
      return i + static_cast<std::size_t>(__builtin_ctzll(m) >> 2);
    }
  }
  return i + (kNarrow ? narrow_until_member_scalar(set, p + i, n - i, out + i)
                      : find_first_code_point_scalar(set, p + i, n - i));
}

}  // namespace

std::size_t find_first_in_set_neon(const byte_set& set, const std::uint8_t* p,
                                   std::size_t n) noexcept {
  if (n < 16) return find_first_in_set_scalar(set, p, n);
  const tables t = load_tables(set);
  std::size_t i = 0;
  for (; n - i >= 16; i += 16) {
    if (const std::uint64_t m = nibble_mask(members(t, vld1q_u8(p + i))))
      return i + static_cast<std::size_t>(__builtin_ctzll(m) >> 2);
  }
  if (i == n) return n;
  const std::uint64_t m = nibble_mask(members(t, vld1q_u8(p + n - 16)));
  return m ? n - 16 + static_cast<std::size_t>(__builtin_ctzll(m) >> 2) : n;
}

std::size_t find_first_code_point_neon(const byte_set& set, const std::uint32_t* p,
                                       std::size_t n) noexcept {
  return code_points_neon<false>(set, p, n, nullptr);
}

std::size_t narrow_until_member_neon(const byte_set& set, const std::uint32_t* p, std::size_t n,
                                     std::uint8_t* out) noexcept {
  return code_points_neon<true>(set, p, n, out);
}

}  // namespace zul::simd::detail
#endif
