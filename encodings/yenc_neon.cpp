// yEnc decoding for arm64, 16 bytes per block, by the rule of the x86-64
// kernels (encodings/yenc_pack.h): a block without "=" is stored whole;
// otherwise the escaped lanes lose 64 more, and each 8-lane half is packed
// with one table lookup whose indices come from the same 256-entry table
// the SSSE3 kernel uses (an index of 0x80 or more gives zero on NEON too)
// and stored as 8 bytes, of which only the kept ones count. The output never
// runs ahead of the input, so every 8-byte store stays inside the buffer.
#include "encodings/yenc_kernels.h"

#if defined(__aarch64__)
#include <arm_neon.h>

#include "encodings/yenc_pack.h"

namespace zul::encodings::detail {

std::size_t decode_yenc_neon(const std::uint8_t* in, std::size_t n, std::uint8_t* out) noexcept {
  using yenc_pack::kKept;
  using yenc_pack::kPack;
  const uint8x16_t equals = vdupq_n_u8('=');
  const uint8x16_t k42 = vdupq_n_u8(42);
  const uint8x16_t k64 = vdupq_n_u8(64);
  // Lane k of each half weighs 1 << k: summing a half's weights gives its mask.
  const uint8x16_t weights = {1, 2, 4, 8, 16, 32, 64, 128, 1, 2, 4, 8, 16, 32, 64, 128};
  std::uint8_t* o = out;
  std::size_t i = 0;
  bool carry = false;  // the previous block ended with an unescaped "="
  for (; n - i >= 16; i += 16) {
    const uint8x16_t v = vld1q_u8(in + i);
    const uint8x16_t value = vsubq_u8(v, k42);
    const uint8x16_t is_eq = vceqq_u8(v, equals);
    if (!carry && vmaxvq_u8(is_eq) == 0) {
      vst1q_u8(o, value);
      o += 16;
      continue;
    }
    const uint8x16_t eq_bits = vandq_u8(is_eq, weights);
    const auto eq = static_cast<std::uint16_t>(vaddv_u8(vget_low_u8(eq_bits)) |
                                               vaddv_u8(vget_high_u8(eq_bits)) << 8);
    const std::uint16_t escaped = yenc_pack::escapes(eq, carry);
    const uint8x16_t is_escaped =
        vtstq_u8(vcombine_u8(vdup_n_u8(static_cast<std::uint8_t>(escaped)),
                             vdup_n_u8(static_cast<std::uint8_t>(escaped >> 8))),
                 weights);
    const uint8x16_t decoded = vsubq_u8(value, vandq_u8(is_escaped, k64));
    const auto keep = static_cast<std::uint16_t>(~(eq & ~escaped));
    const unsigned lo = keep & 0xFF, hi = keep >> 8;
    const uint8x16_t index =
        vcombine_u8(vcreate_u8(kPack[lo]), vcreate_u8(kPack[hi] + 0x0808080808080808ull));
    const uint8x16_t packed = vqtbl1q_u8(decoded, index);
    vst1_u8(o, vget_low_u8(packed));
    o += kKept[lo];
    vst1_u8(o, vget_high_u8(packed));
    o += kKept[hi];
  }
  return yenc_pack::finish(in, i, n, carry, out, o);
}

}  // namespace zul::encodings::detail
#endif
