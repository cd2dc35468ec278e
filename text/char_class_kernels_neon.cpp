// The printable filter for arm64 (NEON is part of the architecture): 32
// bytes a step, each byte kept when it lies in 20..7F (c - 0x20 below 0x60)
// and replaced otherwise by a bit select; the scalar path takes the tail.
#include "text/char_class_kernels.h"

#if defined(__aarch64__)
#include <arm_neon.h>

namespace zul::text::detail {

void replace_non_printable_neon(const std::uint8_t* in, std::size_t n, std::uint8_t replacement,
                                std::uint8_t* out) noexcept {
  const uint8x16_t base = vdupq_n_u8(0x20), span = vdupq_n_u8(0x60);
  const uint8x16_t fill = vdupq_n_u8(replacement);
  auto filter = [&](uint8x16_t v) { return vbslq_u8(vcltq_u8(vsubq_u8(v, base), span), v, fill); };
  std::size_t i = 0;
  for (; n - i >= 32; i += 32) {
    const uint8x16_t a = filter(vld1q_u8(in + i));
    const uint8x16_t b = filter(vld1q_u8(in + i + 16));
    vst1q_u8(out + i, a);
    vst1q_u8(out + i + 16, b);
  }
  replace_non_printable_scalar(in + i, n - i, replacement, out + i);
}

}  // namespace zul::text::detail
#endif
