// Tag removal for AVX-512 with VBMI and VBMI2, 64 bytes a block, when
// nothing replaces the bytes inside tags:
//   step  = +1 on "<", -1 on ">", 0 elsewhere;
//   sum   = running sum of step over the block's lanes (six shifted adds,
//           the shifts by byte permutes across the whole register), so
//           the depth at lane j is depth + sum[j];
//   keep  = lanes where that depth is 0, minus the brackets and zero bytes
//           (none when the depth starts more than 64 away from 0);
// the kept bytes are compressed to the front of a register (VPCOMPRESSB)
// and stored whole: the output never runs ahead of the input, so the store
// stays within the n bytes of room. Blocks with at most one bracket (most
// blocks of real markup) take their masks from the bracket's position
// instead of the running sum.
#include "encodings/html_tags_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"

namespace zul::encodings::detail {

ZUL_AVX512_VBMI2 std::size_t strip_tags_avx512_vbmi2(const std::uint8_t* in, std::size_t n,
                                                     std::uint8_t* out, std::int64_t* depth,
                                                     std::size_t* written) noexcept {
  // shift[s][j] = j - 2^s: the permute that moves each lane 2^s lanes up
  // (lanes below 2^s are zeroed by the mask).
  alignas(64) std::uint8_t shift[6][64];
  for (int s = 0; s < 6; ++s) {
    for (int j = 0; j < 64; ++j) shift[s][j] = static_cast<std::uint8_t>((j - (1 << s)) & 63);
  }
  __m512i shifts[6];
  for (int s = 0; s < 6; ++s) shifts[s] = _mm512_load_si512(shift[s]);
  const __m512i open = _mm512_set1_epi8('<'), close = _mm512_set1_epi8('>');
  const __m512i plus = _mm512_set1_epi8(1), minus = _mm512_set1_epi8(-1);
  std::int64_t d = *depth;
  std::size_t i = 0, o = 0;
  for (; n - i >= 64; i += 64) {
    const __m512i v = _mm512_loadu_si512(in + i);
    const std::uint64_t lt = _mm512_cmpeq_epi8_mask(v, open);
    const std::uint64_t gt = _mm512_cmpeq_epi8_mask(v, close);
    const std::uint64_t nul = _mm512_testn_epi8_mask(v, v);
    const std::uint64_t brackets = lt | gt;
    std::uint64_t keep;
    if ((brackets & (brackets - 1)) == 0) {
      // At most one bracket (typical text): the depth is d below it and
      // d + change from it on.
      if ((brackets | nul) == 0 && d == 0) {
        _mm512_storeu_si512(out + o, v);
        o += 64;
        continue;
      }
      const std::uint64_t below = (brackets - 1) & ~brackets;  // all lanes when there is none
      const std::int64_t after = d + (lt != 0) - (gt != 0);
      keep = ((d == 0 ? below : 0) | (after == 0 ? ~below & ~brackets : 0)) & ~nul;
      d = after;
    } else {
      __m512i sum = _mm512_mask_mov_epi8(_mm512_maskz_mov_epi8(lt, plus), gt, minus);
      for (int s = 0; s < 6; ++s) {
        const __mmask64 upper = ~std::uint64_t{0} << (1 << s);
        sum = _mm512_add_epi8(sum, _mm512_maskz_permutexvar_epi8(upper, shifts[s], sum));
      }
      keep = 0;
      if (d >= -64 && d <= 64) {
        keep = _mm512_cmpeq_epi8_mask(sum, _mm512_set1_epi8(static_cast<char>(-d))) &
               ~(brackets | nul);
      }
      d += __builtin_popcountll(lt) - __builtin_popcountll(gt);
    }
    _mm512_storeu_si512(out + o, _mm512_maskz_compress_epi8(keep, v));
    o += static_cast<std::size_t>(__builtin_popcountll(keep));
  }
  *depth = d;
  *written = o;
  return i;
}

}  // namespace zul::encodings::detail

#endif  // x86-64
