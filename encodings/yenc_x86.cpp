// yEnc decoding for AVX-512 with VBMI2, 64 bytes per block:
//   eq      = lanes holding "="
//   escaped = lanes that follow an "=" that is not itself escaped: eq
//             shifted by one when no two "=" are adjacent, else found by
//             walking the set bits of eq; one bit carries into the next
//             block;
//   value   = byte - 42, minus 64 more where escaped;
//   keep    = every lane but the unescaped "=" lanes;
// the kept values are compressed to the front of a register (VPCOMPRESSB)
// and the whole register stored: the output never runs ahead of the input,
// so the store stays inside the output buffer while a full input block
// remains. No branch depends on whether a block holds an "=" (most blocks
// of real data hold one, too many to predict).
#include "encodings/yenc_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"
#include "encodings/yenc_pack.h"

namespace zul::encodings::detail {

ZUL_AVX512_VBMI2 std::size_t decode_yenc_avx512_vbmi2(const std::uint8_t* in, std::size_t n,
                                                      std::uint8_t* out) noexcept {
  const __m512i equals = _mm512_set1_epi8('=');
  const __m512i minus42 = _mm512_set1_epi8(42);
  const __m512i minus64 = _mm512_set1_epi8(64);
  std::uint8_t* o = out;
  std::size_t i = 0;
  bool carry = false;  // the previous block ended with an unescaped "="
  for (; n - i >= 64; i += 64) {
    const __m512i v = _mm512_loadu_si512(in + i);
    const std::uint64_t eq = _mm512_cmpeq_epi8_mask(v, equals);
    const __m512i value = _mm512_sub_epi8(v, minus42);
    std::uint64_t escaped = carry ? 1 : 0;
    std::uint64_t pending = eq & ~escaped;
    carry = false;
    if ((pending & (pending << 1)) == 0) {
      // No two "=" in a row (the usual case): each escapes the next lane.
      carry = (pending >> 63) != 0;
      escaped |= pending << 1;
      pending = 0;
    }
    while (pending != 0) {
      const unsigned j = static_cast<unsigned>(__builtin_ctzll(pending));
      if (j == 63) {
        carry = true;
        break;
      }
      escaped |= std::uint64_t{2} << j;
      // Clear the "=" at j and the lane it escapes.
      pending &= ~(std::uint64_t{3} << j);
    }
    const std::uint64_t keep = ~(eq & ~escaped);
    const __m512i decoded = _mm512_mask_sub_epi8(value, escaped, value, minus64);
    _mm512_storeu_si512(o, _mm512_maskz_compress_epi8(keep, decoded));
    o += __builtin_popcountll(keep);
  }
  return yenc_pack::finish(in, i, n, carry, out, o);
}

}  // namespace zul::encodings::detail
#endif
