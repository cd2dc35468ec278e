// Bitwise run kernels for x86-64 (AVX2, AVX-512), compiled per function:
// two vectors per step, then one masked step (AVX-512) or the scalar tail.
#include <cstring>

#include "binary/bitwise_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"

namespace zul::binary::detail {
namespace {

enum op_kind { kAnd, kOr, kXor };

template <op_kind Op>
ZUL_AVX2 inline __m256i apply256(__m256i x, __m256i y) {
  if constexpr (Op == kAnd) return _mm256_and_si256(x, y);
  if constexpr (Op == kOr) return _mm256_or_si256(x, y);
  return _mm256_xor_si256(x, y);
}

template <op_kind Op>
ZUL_AVX512 inline __m512i apply512(__m512i x, __m512i y) {
  if constexpr (Op == kAnd) return _mm512_and_si512(x, y);
  if constexpr (Op == kOr) return _mm512_or_si512(x, y);
  return _mm512_xor_si512(x, y);
}

template <op_kind Op>
ZUL_AVX2 void run_avx2(const std::uint8_t* a, const std::uint8_t* b, std::uint8_t* out,
                       std::size_t n) noexcept {
  std::size_t i = 0;
  for (; n - i >= 64; i += 64) {
    const auto* pa = reinterpret_cast<const __m256i*>(a + i);
    const auto* pb = reinterpret_cast<const __m256i*>(b + i);
    const __m256i x0 = apply256<Op>(_mm256_loadu_si256(pa), _mm256_loadu_si256(pb));
    const __m256i x1 = apply256<Op>(_mm256_loadu_si256(pa + 1), _mm256_loadu_si256(pb + 1));
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + i), x0);
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + i + 32), x1);
  }
  for (; i < n; ++i) {
    const std::uint8_t x = a[i], y = b[i];
    out[i] = static_cast<std::uint8_t>(Op == kAnd ? x & y : Op == kOr ? x | y : x ^ y);
  }
}

template <op_kind Op>
ZUL_AVX512 void run_avx512(const std::uint8_t* a, const std::uint8_t* b, std::uint8_t* out,
                           std::size_t n) noexcept {
  std::size_t i = 0;
  for (; n - i >= 128; i += 128) {
    const __m512i x0 = apply512<Op>(_mm512_loadu_si512(a + i), _mm512_loadu_si512(b + i));
    const __m512i x1 = apply512<Op>(_mm512_loadu_si512(a + i + 64), _mm512_loadu_si512(b + i + 64));
    _mm512_storeu_si512(out + i, x0);
    _mm512_storeu_si512(out + i + 64, x1);
  }
  for (; i < n; i += 64) {
    const std::size_t left = n - i;
    const __mmask64 live =
        left >= 64 ? ~__mmask64{0} : _bzhi_u64(~0ull, static_cast<unsigned>(left));
    const __m512i x =
        apply512<Op>(_mm512_maskz_loadu_epi8(live, a + i), _mm512_maskz_loadu_epi8(live, b + i));
    _mm512_mask_storeu_epi8(out + i, live, x);
  }
}

}  // namespace

const bitwise_kernels kBitwiseAvx2{{run_avx2<kAnd>, run_avx2<kOr>, run_avx2<kXor>}};
const bitwise_kernels kBitwiseAvx512{{run_avx512<kAnd>, run_avx512<kOr>, run_avx512<kXor>}};

}  // namespace zul::binary::detail
#endif
