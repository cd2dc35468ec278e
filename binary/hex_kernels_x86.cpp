// Hex kernels for x86-64 (AVX2, AVX-512 BW), compiled per function.
//
// Encode: each input byte b is widened to a 16-bit lane and rearranged to
// (b >> 4) | (b & 15) << 8, so the lane's first byte is the high nibble;
// one byte shuffle through "0123456789ABCDEF" turns every nibble into its
// digit, already in output order.
//
// Decode: per character c, d = c - '0' is a digit value when d <= 9 and
// l = (c | 0x20) - 'a' a letter value when l <= 5; anything else counts 0.
// A multiply-add of each pair with (16, 1) gives 16 * high + low in a 16-bit
// lane, narrowed to one byte.
//
// Spaced pairs (dumps of one-byte groups): 16 bytes give 32 digits in two
// vectors a (bytes 0-7) and b (bytes 8-15); three byte shuffles put them at
// their places in the 48 output characters (digits 2g, 2g + 1 of group g at
// 3g, 3g + 1) with zeros at every 3g + 2, which an OR fills with the spacer.
#include "binary/hex_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"

namespace zul::binary::detail {
namespace {

ZUL_AVX2 inline __m256i digits256(__m256i lanes) {
  const __m256i digits = _mm256_setr_epi8('0', '1', '2', '3', '4', '5', '6', '7', '8', '9', 'A',
                                          'B', 'C', 'D', 'E', 'F', '0', '1', '2', '3', '4', '5',
                                          '6', '7', '8', '9', 'A', 'B', 'C', 'D', 'E', 'F');
  const __m256i nibble = _mm256_set1_epi16(0x000F);
  const __m256i n = _mm256_or_si256(_mm256_and_si256(_mm256_srli_epi16(lanes, 4), nibble),
                                    _mm256_slli_epi16(_mm256_and_si256(lanes, nibble), 8));
  return _mm256_shuffle_epi8(digits, n);
}

ZUL_AVX2 inline __m256i values256(__m256i c) {
  const __m256i d = _mm256_sub_epi8(c, _mm256_set1_epi8('0'));
  const __m256i is_d = _mm256_cmpeq_epi8(_mm256_min_epu8(d, _mm256_set1_epi8(9)), d);
  const __m256i l =
      _mm256_sub_epi8(_mm256_or_si256(c, _mm256_set1_epi8(0x20)), _mm256_set1_epi8('a'));
  const __m256i is_l = _mm256_cmpeq_epi8(_mm256_min_epu8(l, _mm256_set1_epi8(5)), l);
  const __m256i pairs = _mm256_or_si256(
      _mm256_and_si256(d, is_d), _mm256_and_si256(_mm256_add_epi8(l, _mm256_set1_epi8(10)), is_l));
  return _mm256_maddubs_epi16(pairs, _mm256_set1_epi16(0x0110));
}

ZUL_AVX512 inline __m512i broadcast512(__m128i v) {
  // The masked form: GCC 12 flags the plain broadcast's undefined source.
  return _mm512_maskz_broadcast_i32x4(static_cast<__mmask16>(0xFFFF), v);
}

ZUL_AVX512 inline __m512i digits512(__m512i lanes) {
  const __m512i digits = broadcast512(_mm_setr_epi8('0', '1', '2', '3', '4', '5', '6', '7', '8',
                                                    '9', 'A', 'B', 'C', 'D', 'E', 'F'));
  const __m512i nibble = _mm512_set1_epi16(0x000F);
  const __m512i n = _mm512_or_si512(_mm512_and_si512(_mm512_srli_epi16(lanes, 4), nibble),
                                    _mm512_slli_epi16(_mm512_and_si512(lanes, nibble), 8));
  return _mm512_shuffle_epi8(digits, n);
}

ZUL_AVX512 inline __m512i values512(__m512i c) {
  const __m512i d = _mm512_sub_epi8(c, _mm512_set1_epi8('0'));
  const __mmask64 is_d = _mm512_cmple_epu8_mask(d, _mm512_set1_epi8(9));
  const __m512i l =
      _mm512_sub_epi8(_mm512_or_si512(c, _mm512_set1_epi8(0x20)), _mm512_set1_epi8('a'));
  const __mmask64 is_l = _mm512_cmple_epu8_mask(l, _mm512_set1_epi8(5));
  const __m512i pairs =
      _mm512_mask_add_epi8(_mm512_maskz_mov_epi8(is_d, d), is_l, l, _mm512_set1_epi8(10));
  return _mm512_maddubs_epi16(pairs, _mm512_set1_epi16(0x0110));
}

}  // namespace

ZUL_AVX2 void encode_hex_avx2(const std::uint8_t* in, std::size_t n, char* out) noexcept {
  std::size_t i = 0;
  for (; n - i >= 32; i += 32) {
    const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i));
    const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i + 16));
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + 2 * i),
                        digits256(_mm256_cvtepu8_epi16(a)));
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + 2 * i + 32),
                        digits256(_mm256_cvtepu8_epi16(b)));
  }
  encode_hex_scalar(in + i, n - i, out + 2 * i);
}

ZUL_AVX2 void decode_hex_avx2(const char* in, std::size_t n, std::uint8_t* out) noexcept {
  std::size_t k = 0;
  for (; n - k >= 32; k += 32) {
    const __m256i a = values256(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + 2 * k)));
    const __m256i b =
        values256(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + 2 * k + 32)));
    // packus interleaves 128-bit lanes (a0 b0 a1 b1); the permute restores order.
    const __m256i bytes = _mm256_permute4x64_epi64(_mm256_packus_epi16(a, b), 0xD8);
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + k), bytes);
  }
  decode_hex_scalar(in + 2 * k, n - k, out + k);
}

ZUL_AVX512 void encode_hex_avx512(const std::uint8_t* in, std::size_t n, char* out) noexcept {
  std::size_t i = 0;
  for (; n - i >= 64; i += 64) {
    const __m256i a = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i));
    const __m256i b = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i + 32));
    _mm512_storeu_si512(out + 2 * i, digits512(_mm512_cvtepu8_epi16(a)));
    _mm512_storeu_si512(out + 2 * i + 64, digits512(_mm512_cvtepu8_epi16(b)));
  }
  encode_hex_scalar(in + i, n - i, out + 2 * i);
}

ZUL_AVX512 void decode_hex_avx512(const char* in, std::size_t n, std::uint8_t* out) noexcept {
  std::size_t k = 0;
  const __m512i order = _mm512_setr_epi64(0, 2, 4, 6, 1, 3, 5, 7);
  for (; n - k >= 64; k += 64) {
    const __m512i a = values512(_mm512_loadu_si512(in + 2 * k));
    const __m512i b = values512(_mm512_loadu_si512(in + 2 * k + 64));
    // Masked permute: GCC 12 flags the plain form's undefined source.
    const __m512i bytes = _mm512_maskz_permutexvar_epi64(0xFF, order, _mm512_packus_epi16(a, b));
    _mm512_storeu_si512(out + k, bytes);
  }
  decode_hex_scalar(in + 2 * k, n - k, out + k);
}

ZUL_AVX2 void spaced_pairs_avx2(const std::uint8_t* in, std::size_t n, char spacer,
                                char* out) noexcept {
  const __m128i digits =
      _mm_setr_epi8('0', '1', '2', '3', '4', '5', '6', '7', '8', '9', 'A', 'B', 'C', 'D', 'E', 'F');
  const __m128i nibble = _mm_set1_epi8(0x0F);
  constexpr char X = -128;  // shuffles to zero
  const char s = spacer;
  const __m128i index0 = _mm_setr_epi8(0, 1, X, 2, 3, X, 4, 5, X, 6, 7, X, 8, 9, X, 10);
  const __m128i index1a = _mm_setr_epi8(11, X, 12, 13, X, 14, 15, X, X, X, X, X, X, X, X, X);
  const __m128i index1b = _mm_setr_epi8(X, X, X, X, X, X, X, X, 0, 1, X, 2, 3, X, 4, 5);
  const __m128i index2 = _mm_setr_epi8(X, 6, 7, X, 8, 9, X, 10, 11, X, 12, 13, X, 14, 15, X);
  const __m128i space0 = _mm_setr_epi8(0, 0, s, 0, 0, s, 0, 0, s, 0, 0, s, 0, 0, s, 0);
  const __m128i space1 = _mm_setr_epi8(0, s, 0, 0, s, 0, 0, s, 0, 0, s, 0, 0, s, 0, 0);
  const __m128i space2 = _mm_setr_epi8(s, 0, 0, s, 0, 0, s, 0, 0, s, 0, 0, s, 0, 0, s);
  std::size_t i = 0;
  for (; n - i >= 16; i += 16, out += 48) {
    const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i));
    const __m128i high = _mm_shuffle_epi8(digits, _mm_and_si128(_mm_srli_epi16(v, 4), nibble));
    const __m128i low = _mm_shuffle_epi8(digits, _mm_and_si128(v, nibble));
    const __m128i a = _mm_unpacklo_epi8(high, low);
    const __m128i b = _mm_unpackhi_epi8(high, low);
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out),
                     _mm_or_si128(_mm_shuffle_epi8(a, index0), space0));
    _mm_storeu_si128(
        reinterpret_cast<__m128i*>(out + 16),
        _mm_or_si128(_mm_or_si128(_mm_shuffle_epi8(a, index1a), _mm_shuffle_epi8(b, index1b)),
                     space1));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out + 32),
                     _mm_or_si128(_mm_shuffle_epi8(b, index2), space2));
  }
  spaced_pairs_scalar(in + i, n - i, spacer, out);
}

}  // namespace zul::binary::detail
#endif
