// arm64 block kernel for UTF-8 well-formedness: the lookup-table method with
// the tables of common/utf8_classes.h, TBL for the three look-ups, 16-byte
// blocks checked four at a time. A run of four ASCII blocks is checked only
// for a sequence that the block before left open. Text dense with faults
// has no keep-mask kernel here: the repair takes it byte by byte.
#include "common/utf8_valid.h"

#if defined(__aarch64__)
#include <arm_neon.h>

#include "common/utf8_classes.h"

namespace zul::simd::detail {
namespace {

using namespace utf8_classes;

struct consts {
  uint8x16_t byte1_high, byte1_low, byte2_high, open_at_end;
};

// Subtracted with saturation from a block: above zero only in its last
// three bytes, where a sequence is still open at the block's end (a lead
// of F0..FF three bytes from the end, E0..FF two, C0..FF one).
constexpr std::uint8_t kOpenAtEnd[16] = {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF,
                                         0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xEF, 0xDF, 0xBF};

// Error bits for the 16 bytes v, given the bytes 1, 2 and 3 before each.
inline uint8x16_t errors(const consts& k, uint8x16_t v, uint8x16_t prev1, uint8x16_t prev2,
                         uint8x16_t prev3) {
  const uint8x16_t special =
      vandq_u8(vandq_u8(vqtbl1q_u8(k.byte1_high, vshrq_n_u8(prev1, 4)),
                        vqtbl1q_u8(k.byte1_low, vandq_u8(prev1, vdupq_n_u8(0x0F)))),
               vqtbl1q_u8(k.byte2_high, vshrq_n_u8(v, 4)));
  const uint8x16_t third = vqsubq_u8(prev2, vdupq_n_u8(0x60));
  const uint8x16_t fourth = vqsubq_u8(prev3, vdupq_n_u8(0x70));
  const uint8x16_t must23 = vandq_u8(vorrq_u8(third, fourth), vdupq_n_u8(0x80));
  return veorq_u8(must23, special);
}

// Error bits for the 16 bytes v at offset at of in (at >= 3).
inline uint8x16_t check_at(const consts& k, const std::uint8_t* in, uint8x16_t v, std::size_t at) {
  return errors(k, v, vld1q_u8(in + at - 1), vld1q_u8(in + at - 2), vld1q_u8(in + at - 3));
}

inline bool any(uint8x16_t v) { return vmaxvq_u8(v) != 0; }

std::size_t copy_valid_neon(const std::uint8_t* in, std::size_t n, std::uint8_t* out) noexcept {
  if (n < 16) return 0;
  const consts k{vld1q_u8(kByte1High), vld1q_u8(kByte1Low), vld1q_u8(kByte2High),
                 vld1q_u8(kOpenAtEnd)};
  // The first block: the bytes before it count as ASCII.
  uint8x16_t v = vld1q_u8(in);
  const uint8x16_t zero = vdupq_n_u8(0);
  if (any(errors(k, v, vextq_u8(zero, v, 15), vextq_u8(zero, v, 14), vextq_u8(zero, v, 13)))) {
    return 0;
  }
  uint8x16_t open = vqsubq_u8(v, k.open_at_end);
  if (out != nullptr) vst1q_u8(out, v);
  // Four blocks with one test; the single blocks below find the faulty one
  // of four, and take the last blocks.
  std::size_t i = 16;
  for (; i + 64 <= n; i += 64) {
    const uint8x16_t v0 = vld1q_u8(in + i), v1 = vld1q_u8(in + i + 16);
    const uint8x16_t v2 = vld1q_u8(in + i + 32), v3 = vld1q_u8(in + i + 48);
    if (vmaxvq_u8(vorrq_u8(vorrq_u8(v0, v1), vorrq_u8(v2, v3))) >= 0x80) {
      const uint8x16_t error =
          vorrq_u8(vorrq_u8(check_at(k, in, v0, i), check_at(k, in, v1, i + 16)),
                   vorrq_u8(check_at(k, in, v2, i + 32), check_at(k, in, v3, i + 48)));
      if (any(error)) break;
      open = vqsubq_u8(v3, k.open_at_end);
    } else if (any(open)) {
      break;
    }
    if (out != nullptr) {
      vst1q_u8(out + i, v0);
      vst1q_u8(out + i + 16, v1);
      vst1q_u8(out + i + 32, v2);
      vst1q_u8(out + i + 48, v3);
    }
  }
  for (; i + 16 <= n; i += 16) {
    v = vld1q_u8(in + i);
    uint8x16_t error = open;
    if (vmaxvq_u8(v) >= 0x80) {
      // The check covers a sequence left open by the block before.
      error = check_at(k, in, v, i);
      open = vqsubq_u8(v, k.open_at_end);
    }
    if (any(error)) break;
    if (out != nullptr) vst1q_u8(out + i, v);
  }
  return utf8_boundary_before(in, i);
}

}  // namespace

const utf8_kernels kUtf8Neon{copy_valid_neon, nullptr, 16};

}  // namespace zul::simd::detail
#endif
