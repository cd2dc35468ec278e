// The boolean-candidate search for x86-64, compiled per function for AVX2
// and AVX-512 (BW), with the nibble class tables of encodings/sql_kernels.h.
// The previous bytes are classified from a second load one byte back; a
// byte is a candidate when it is a quote, or an initial after a separator.
#include "encodings/sql_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"

namespace zul::encodings::detail {
namespace {

using sql_classes::kHigh;
using sql_classes::kInitial;
using sql_classes::kLow;
using sql_classes::kQuote;
using sql_classes::kSeparator;

struct classes256 {
  __m256i low, high, nibble;
};

ZUL_AVX2 inline __m256i classify256(const classes256& t, __m256i v) {
  const __m256i lo = _mm256_shuffle_epi8(t.low, _mm256_and_si256(v, t.nibble));
  const __m256i hi =
      _mm256_shuffle_epi8(t.high, _mm256_and_si256(_mm256_srli_epi16(v, 4), t.nibble));
  return _mm256_and_si256(lo, hi);
}

// Bit i set where lane i of v has a bit of bits.
ZUL_AVX2 inline std::uint32_t any_bits256(__m256i v, char bits) {
  const __m256i none =
      _mm256_cmpeq_epi8(_mm256_and_si256(v, _mm256_set1_epi8(bits)), _mm256_setzero_si256());
  return ~static_cast<std::uint32_t>(_mm256_movemask_epi8(none));
}

// The masked form: GCC 12 flags the plain broadcast's undefined source.
ZUL_AVX512 inline __m512i broadcast512(const char* table) {
  return _mm512_maskz_broadcast_i32x4(static_cast<__mmask16>(0xFFFF),
                                      _mm_loadu_si128(reinterpret_cast<const __m128i*>(table)));
}

struct classes512 {
  __m512i low, high, nibble;
};

ZUL_AVX512 inline __m512i classify512(const classes512& t, __m512i v) {
  const __m512i lo = _mm512_shuffle_epi8(t.low, _mm512_and_si512(v, t.nibble));
  const __m512i hi =
      _mm512_shuffle_epi8(t.high, _mm512_and_si512(_mm512_srli_epi16(v, 4), t.nibble));
  return _mm512_and_si512(lo, hi);
}

}  // namespace

ZUL_AVX2 std::size_t find_boolean_candidate_avx2(const std::uint8_t* p, std::size_t n) noexcept {
  const classes256 t{
      _mm256_broadcastsi128_si256(_mm_loadu_si128(reinterpret_cast<const __m128i*>(kLow))),
      _mm256_broadcastsi128_si256(_mm_loadu_si128(reinterpret_cast<const __m128i*>(kHigh))),
      _mm256_set1_epi8(0x0F)};
  std::size_t i = 0;
  for (; n - i >= 32; i += 32) {
    const __m256i c = classify256(t, _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p + i)));
    const __m256i before =
        classify256(t, _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p + i - 1)));
    const std::uint32_t m =
        any_bits256(c, kQuote) | (any_bits256(c, kInitial) & any_bits256(before, kSeparator));
    if (m != 0) return i + static_cast<std::size_t>(__builtin_ctz(m));
  }
  return i + find_boolean_candidate_scalar(p + i, n - i);
}

ZUL_AVX512 std::size_t find_boolean_candidate_avx512(const std::uint8_t* p,
                                                     std::size_t n) noexcept {
  const classes512 t{broadcast512(kLow), broadcast512(kHigh), _mm512_set1_epi8(0x0F)};
  const __m512i quote = _mm512_set1_epi8(kQuote), initial = _mm512_set1_epi8(kInitial),
                separator = _mm512_set1_epi8(kSeparator);
  for (std::size_t i = 0; i < n; i += 64) {
    const std::size_t left = n - i;
    const __mmask64 live =
        left >= 64 ? ~__mmask64{0} : _bzhi_u64(~0ull, static_cast<unsigned>(left));
    const __m512i c = classify512(t, _mm512_maskz_loadu_epi8(live, p + i));
    const __m512i before = classify512(t, _mm512_maskz_loadu_epi8(live, p + i - 1));
    const __mmask64 m =
        (_mm512_test_epi8_mask(c, quote) |
         (_mm512_test_epi8_mask(c, initial) & _mm512_test_epi8_mask(before, separator))) &
        live;
    if (m != 0) return i + static_cast<std::size_t>(__builtin_ctzll(m));
  }
  return n;
}

}  // namespace zul::encodings::detail
#endif
