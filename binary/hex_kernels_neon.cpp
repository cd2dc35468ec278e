// Hex kernels for arm64 (NEON is part of the architecture), 16 bytes a step:
// encoding looks both nibbles up in a 16-entry digit table and stores the
// two digit vectors interleaved; decoding loads the digit pairs
// de-interleaved and maps "0"-"9", "A"-"F" and "a"-"f" to their values and
// every other character to 0, as the scalar path does. Tails go to it.
#include "binary/hex_kernels.h"

#if defined(__aarch64__)
#include <arm_neon.h>

#include "common/hex_digits.h"

namespace zul::binary::detail {

void encode_hex_neon(const std::uint8_t* in, std::size_t n, char* out) noexcept {
  const uint8x16_t digits = vld1q_u8(reinterpret_cast<const std::uint8_t*>(kHexDigits));
  const uint8x16_t low_nibble = vdupq_n_u8(0x0F);
  std::size_t i = 0;
  for (; n - i >= 16; i += 16, out += 32) {
    const uint8x16_t v = vld1q_u8(in + i);
    uint8x16x2_t pairs;
    pairs.val[0] = vqtbl1q_u8(digits, vshrq_n_u8(v, 4));
    pairs.val[1] = vqtbl1q_u8(digits, vandq_u8(v, low_nibble));
    vst2q_u8(reinterpret_cast<std::uint8_t*>(out), pairs);
  }
  encode_hex_scalar(in + i, n - i, out);
}

namespace {

// The value of each hex digit of v, 0 for any other character.
inline uint8x16_t digit_values(uint8x16_t v) {
  const uint8x16_t decimal = vsubq_u8(v, vdupq_n_u8('0'));
  const uint8x16_t letter = vsubq_u8(vorrq_u8(v, vdupq_n_u8(0x20)), vdupq_n_u8('a'));
  const uint8x16_t is_decimal = vcltq_u8(decimal, vdupq_n_u8(10));
  const uint8x16_t is_letter = vcltq_u8(letter, vdupq_n_u8(6));
  return vorrq_u8(vandq_u8(decimal, is_decimal),
                  vandq_u8(vaddq_u8(letter, vdupq_n_u8(10)), is_letter));
}

}  // namespace

void decode_hex_neon(const char* in, std::size_t n, std::uint8_t* out) noexcept {
  std::size_t k = 0;
  for (; n - k >= 16; k += 16, in += 32) {
    const uint8x16x2_t pairs = vld2q_u8(reinterpret_cast<const std::uint8_t*>(in));
    vst1q_u8(out + k,
             vorrq_u8(vshlq_n_u8(digit_values(pairs.val[0]), 4), digit_values(pairs.val[1])));
  }
  decode_hex_scalar(in, n - k, out + k);
}

}  // namespace zul::binary::detail
#endif
