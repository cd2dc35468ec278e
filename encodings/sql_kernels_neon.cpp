// The boolean-candidate search for arm64, 16 bytes a round, with the nibble
// class tables of encodings/sql_kernels.h: each byte and the byte before it
// are classified by two table look-ups; a byte is a candidate when it is a
// quote, or an initial after a separator.
#include "encodings/sql_kernels.h"

#if defined(__aarch64__)
#include <arm_neon.h>

namespace zul::encodings::detail {
namespace {

inline uint8x16_t classify(uint8x16_t low, uint8x16_t high, uint8x16_t v) {
  return vandq_u8(vqtbl1q_u8(low, vandq_u8(v, vdupq_n_u8(0x0F))),
                  vqtbl1q_u8(high, vshrq_n_u8(v, 4)));
}

}  // namespace

std::size_t find_boolean_candidate_neon(const std::uint8_t* p, std::size_t n) noexcept {
  const uint8x16_t low = vld1q_u8(reinterpret_cast<const std::uint8_t*>(sql_classes::kLow));
  const uint8x16_t high = vld1q_u8(reinterpret_cast<const std::uint8_t*>(sql_classes::kHigh));
  const uint8x16_t quote = vdupq_n_u8(sql_classes::kQuote);
  const uint8x16_t initial = vdupq_n_u8(sql_classes::kInitial);
  const uint8x16_t separator = vdupq_n_u8(sql_classes::kSeparator);
  std::size_t i = 0;
  for (; n - i >= 16; i += 16) {
    const uint8x16_t c = classify(low, high, vld1q_u8(p + i));
    const uint8x16_t before = classify(low, high, vld1q_u8(p + i - 1));
    const uint8x16_t hit =
        vorrq_u8(vtstq_u8(c, quote), vandq_u8(vtstq_u8(c, initial), vtstq_u8(before, separator)));
    if (vmaxvq_u8(hit) != 0) {
      // Four bits a lane: the first set nibble is the first candidate.
      const std::uint64_t nibbles =
          vget_lane_u64(vreinterpret_u64_u8(vshrn_n_u16(vreinterpretq_u16_u8(hit), 4)), 0);
      return i + static_cast<std::size_t>(__builtin_ctzll(nibbles)) / 4;
    }
  }
  return i + find_boolean_candidate_scalar(p + i, n - i);
}

}  // namespace zul::encodings::detail
#endif
