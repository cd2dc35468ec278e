// The printable filter for x86-64 (AVX2, AVX-512), compiled per function:
// a byte is kept when c - 0x20 <= 0x5F unsigned (AVX2 has no unsigned
// compare: min(t, 0x5F) == t), else replaced through a blend.
#include "text/char_class_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"

namespace zul::text::detail {

ZUL_AVX2 void replace_non_printable_avx2(const std::uint8_t* in, std::size_t n,
                                         std::uint8_t replacement, std::uint8_t* out) noexcept {
  const __m256i space = _mm256_set1_epi8(0x20), last = _mm256_set1_epi8(0x5F);
  const __m256i with = _mm256_set1_epi8(static_cast<char>(replacement));
  std::size_t i = 0;
  for (; n - i >= 32; i += 32) {
    const __m256i c = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i));
    const __m256i t = _mm256_sub_epi8(c, space);
    const __m256i keep = _mm256_cmpeq_epi8(_mm256_min_epu8(t, last), t);
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + i), _mm256_blendv_epi8(with, c, keep));
  }
  replace_non_printable_scalar(in + i, n - i, replacement, out + i);
}

ZUL_AVX512 void replace_non_printable_avx512(const std::uint8_t* in, std::size_t n,
                                             std::uint8_t replacement, std::uint8_t* out) noexcept {
  const __m512i space = _mm512_set1_epi8(0x20), last = _mm512_set1_epi8(0x5F);
  const __m512i with = _mm512_set1_epi8(static_cast<char>(replacement));
  for (std::size_t i = 0; i < n; i += 64) {
    const std::size_t left = n - i;
    const __mmask64 live =
        left >= 64 ? ~__mmask64{0} : _bzhi_u64(~0ull, static_cast<unsigned>(left));
    const __m512i c = _mm512_maskz_loadu_epi8(live, in + i);
    const __mmask64 keep = _mm512_cmple_epu8_mask(_mm512_sub_epi8(c, space), last);
    _mm512_mask_storeu_epi8(out + i, live, _mm512_mask_blend_epi8(keep, with, c));
  }
}

}  // namespace zul::text::detail
#endif
