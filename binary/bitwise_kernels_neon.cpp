// Bitwise run kernels for arm64 (NEON is part of the architecture): two
// 16-byte vectors per step, then the scalar tail.
#include "binary/bitwise_kernels.h"

#if defined(__aarch64__)
#include <arm_neon.h>

namespace zul::binary::detail {
namespace {

enum op_kind { kAnd, kOr, kXor };

template <op_kind Op>
inline uint8x16_t apply(uint8x16_t x, uint8x16_t y) {
  if constexpr (Op == kAnd) return vandq_u8(x, y);
  if constexpr (Op == kOr) return vorrq_u8(x, y);
  return veorq_u8(x, y);
}

template <op_kind Op>
void run_neon(const std::uint8_t* a, const std::uint8_t* b, std::uint8_t* out,
              std::size_t n) noexcept {
  std::size_t i = 0;
  for (; n - i >= 32; i += 32) {
    const uint8x16_t x0 = apply<Op>(vld1q_u8(a + i), vld1q_u8(b + i));
    const uint8x16_t x1 = apply<Op>(vld1q_u8(a + i + 16), vld1q_u8(b + i + 16));
    vst1q_u8(out + i, x0);
    vst1q_u8(out + i + 16, x1);
  }
  kBitwiseScalar.run[Op](a + i, b + i, out + i, n - i);
}

}  // namespace

const bitwise_kernels kBitwiseNeon{{run_neon<kAnd>, run_neon<kOr>, run_neon<kXor>}};

}  // namespace zul::binary::detail
#endif
