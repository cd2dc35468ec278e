// arm64 kernels for the single-byte character sets, 16 lanes a block.
// Decoding widens a block of bytes to units and stores it; lanes holding
// 80..9F then take their unit from the table. Encoding narrows a block of
// units to bytes and stores it whole when every unit encodes to itself
// (below 0x80, A0..FF, and 80..9F for a set that keeps them); a block with
// any other unit goes unit by unit through the reverse map. The output
// never passes the input, so the whole-block store always has room.
#include "text/latin1_kernels.h"

#if defined(__aarch64__)
#include <arm_neon.h>

#include "text/latin1.h"

namespace zul::text::detail {
namespace {

std::size_t decode_neon(const std::uint8_t* in, std::size_t n, std::uint16_t* out,
                        const std::uint16_t* c1) noexcept {
  std::size_t i = 0;
  for (; n - i >= 16; i += 16) {
    const uint8x16_t v = vld1q_u8(in + i);
    vst1q_u16(out + i, vmovl_u8(vget_low_u8(v)));
    vst1q_u16(out + i + 8, vmovl_u8(vget_high_u8(v)));
    if (c1 != nullptr && vmaxvq_u8(vcltq_u8(vsubq_u8(v, vdupq_n_u8(0x80)), vdupq_n_u8(0x20)))) {
      for (std::size_t k = i; k < i + 16; ++k) {
        if (in[k] >= 0x80 && in[k] <= 0x9F) out[k] = c1[in[k] - 0x80];
      }
    }
  }
  return i;
}

std::size_t encode_neon(const std::uint16_t* in, std::size_t n, std::uint8_t* out,
                        const single_byte_charset& set, std::size_t* written) noexcept {
  // Units 80..9F encode to themselves only in a set that keeps them.
  const bool c1_identity = byte_for_unit(set, 0x80) == 0x80 && byte_for_unit(set, 0x9F) == 0x9F;
  const uint16x8_t c1_low = vdupq_n_u16(c1_identity ? 0x100 : 0x80);
  const uint16x8_t c1_span = vdupq_n_u16(c1_identity ? 0 : 0x20);
  const uint16x8_t byte_max = vdupq_n_u16(0xFF);
  std::size_t i = 0, o = 0;
  for (; n - i >= 16; i += 16) {
    const uint16x8_t u0 = vld1q_u16(in + i), u1 = vld1q_u16(in + i + 8);
    vst1q_u8(out + o, vcombine_u8(vmovn_u16(u0), vmovn_u16(u1)));
    // Lanes above FF, or in 80..9F when those need the table.
    const uint16x8_t odd0 =
        vorrq_u16(vcgtq_u16(u0, byte_max), vcltq_u16(vsubq_u16(u0, c1_low), c1_span));
    const uint16x8_t odd1 =
        vorrq_u16(vcgtq_u16(u1, byte_max), vcltq_u16(vsubq_u16(u1, c1_low), c1_span));
    if (vmaxvq_u16(vorrq_u16(odd0, odd1)) == 0) {
      o += 16;
      continue;
    }
    for (std::size_t k = i; k < i + 16; ++k) {
      const int b = byte_for_unit(set, in[k]);
      out[o] = static_cast<std::uint8_t>(b);  // kept only when b is a byte
      o += b >= 0;
    }
  }
  *written = o;
  return i;
}

}  // namespace

const single_byte_kernels kSingleByteNeon{decode_neon, encode_neon};

}  // namespace zul::text::detail
#endif
