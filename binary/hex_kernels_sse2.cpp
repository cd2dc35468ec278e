// Hex kernels for the SSE2 baseline of x86-64, plain arithmetic (SSE2 has
// no byte shuffle to look digits up).
//
// Encode: the high and low nibbles n of 16 bytes become '0' + n, plus 7
// where n > 9, and are interleaved high first.
//
// Decode: each character's value as in the wider kernels (a digit when
// c - '0' <= 9, a letter when (c | 0x20) - 'a' <= 5, else 0); a pair's
// 16-bit lane w holds the high digit's value in its low byte, so the byte
// is (w << 4 & 0xFF) | w >> 8, and the lanes narrow with unsigned
// saturation, which never saturates.
#include "binary/hex_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <emmintrin.h>

namespace zul::binary::detail {
namespace {

inline __m128i digits128(__m128i nibbles) {
  const __m128i letters =
      _mm_and_si128(_mm_cmpgt_epi8(nibbles, _mm_set1_epi8(9)), _mm_set1_epi8(7));
  return _mm_add_epi8(_mm_add_epi8(nibbles, _mm_set1_epi8('0')), letters);
}

inline __m128i values128(__m128i c) {
  const __m128i d = _mm_sub_epi8(c, _mm_set1_epi8('0'));
  const __m128i is_d = _mm_cmpeq_epi8(_mm_min_epu8(d, _mm_set1_epi8(9)), d);
  const __m128i l = _mm_sub_epi8(_mm_or_si128(c, _mm_set1_epi8(0x20)), _mm_set1_epi8('a'));
  const __m128i is_l = _mm_cmpeq_epi8(_mm_min_epu8(l, _mm_set1_epi8(5)), l);
  const __m128i v =
      _mm_or_si128(_mm_and_si128(d, is_d), _mm_and_si128(_mm_add_epi8(l, _mm_set1_epi8(10)), is_l));
  return _mm_or_si128(_mm_and_si128(_mm_slli_epi16(v, 4), _mm_set1_epi16(0x00FF)),
                      _mm_srli_epi16(v, 8));
}

}  // namespace

void encode_hex_sse2(const std::uint8_t* in, std::size_t n, char* out) noexcept {
  const __m128i nibble = _mm_set1_epi8(0x0F);
  std::size_t i = 0;
  for (; n - i >= 16; i += 16) {
    const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i));
    const __m128i hi = digits128(_mm_and_si128(_mm_srli_epi16(v, 4), nibble));
    const __m128i lo = digits128(_mm_and_si128(v, nibble));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out + 2 * i), _mm_unpacklo_epi8(hi, lo));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out + 2 * i + 16), _mm_unpackhi_epi8(hi, lo));
  }
  encode_hex_scalar(in + i, n - i, out + 2 * i);
}

void decode_hex_sse2(const char* in, std::size_t n, std::uint8_t* out) noexcept {
  std::size_t k = 0;
  for (; n - k >= 16; k += 16) {
    const __m128i a = values128(_mm_loadu_si128(reinterpret_cast<const __m128i*>(in + 2 * k)));
    const __m128i b = values128(_mm_loadu_si128(reinterpret_cast<const __m128i*>(in + 2 * k + 16)));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out + k), _mm_packus_epi16(a, b));
  }
  decode_hex_scalar(in + 2 * k, n - k, out + k);
}

}  // namespace zul::binary::detail
#endif
