// Tag removal for SSE2 and AVX2 (no compress instruction), 64 bytes a
// block, when nothing replaces the bytes inside tags. The brackets and zero
// bytes of a block cut it into segments of constant depth; each segment at
// depth 0 is moved with whole 64-byte copies (a block without brackets or
// zero bytes is one segment), so typical markup, a bracket every few dozen
// bytes, costs one or two copies a block. The output never runs ahead of
// the input, and a block runs only while another whole block of input
// follows, so every copy stays within the input and the n bytes of room.
#include "encodings/html_tags_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"

namespace zul::encodings::detail {
namespace {

// Blocks with more brackets and zero bytes than this go byte by byte.
constexpr int kDense = 16;

// The segments of one block, given its bracket and zero-byte masks (bit k:
// byte k); copy(to, from) moves 64 bytes. Updates the depth d and the
// output count o.
template <class Copy>
__attribute__((always_inline)) inline void strip_segments(const std::uint8_t* in, std::uint64_t lt,
                                                          std::uint64_t gt, std::uint64_t nul,
                                                          std::uint8_t* out, std::int64_t& d,
                                                          std::size_t& o, Copy copy) {
  std::uint64_t cuts = lt | gt | nul;
  if (__builtin_popcountll(cuts) > kDense) {
    // Markup dense with brackets: one byte at a time, as the rules say.
    for (std::size_t k = 0; k < 64; ++k) {
      const std::uint8_t c = in[k];
      if (c == '<') {
        ++d;
      } else if (c == '>') {
        --d;
      } else if (c != '\0' && d == 0) {
        out[o++] = c;
      }
    }
    return;
  }
  std::size_t start = 0;
  for (;;) {
    const std::size_t end = cuts == 0 ? 64 : static_cast<std::size_t>(__builtin_ctzll(cuts));
    if (d == 0 && end > start) {
      copy(out + o, in + start);
      o += end - start;
    }
    if (cuts == 0) return;
    d += static_cast<std::int64_t>((lt >> end) & 1) - static_cast<std::int64_t>((gt >> end) & 1);
    start = end + 1;
    cuts &= cuts - 1;
  }
}

struct copy_sse2 {
  void operator()(std::uint8_t* to, const std::uint8_t* from) const {
    for (int k = 0; k < 64; k += 16) {
      _mm_storeu_si128(reinterpret_cast<__m128i*>(to + k),
                       _mm_loadu_si128(reinterpret_cast<const __m128i*>(from + k)));
    }
  }
};

struct copy_avx2 {
  ZUL_AVX2 void operator()(std::uint8_t* to, const std::uint8_t* from) const {
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(to),
                        _mm256_loadu_si256(reinterpret_cast<const __m256i*>(from)));
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(to + 32),
                        _mm256_loadu_si256(reinterpret_cast<const __m256i*>(from + 32)));
  }
};

std::size_t strip_tags_sse2(const std::uint8_t* in, std::size_t n, std::uint8_t* out,
                            std::int64_t* depth, std::size_t* written) noexcept {
  std::int64_t d = *depth;
  std::size_t i = 0, o = 0;
  const __m128i open = _mm_set1_epi8('<'), close = _mm_set1_epi8('>');
  const __m128i zero = _mm_setzero_si128();
  for (; n - i >= 128; i += 64) {
    // Most blocks of text have no bracket or zero byte: one test for all.
    __m128i any = zero;
    for (int k = 0; k < 64; k += 16) {
      const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i + k));
      any = _mm_or_si128(
          any, _mm_or_si128(_mm_or_si128(_mm_cmpeq_epi8(v, open), _mm_cmpeq_epi8(v, close)),
                            _mm_cmpeq_epi8(v, zero)));
    }
    if (_mm_movemask_epi8(any) == 0) {
      if (d == 0) {
        copy_sse2{}(out + o, in + i);
        o += 64;
      }
      continue;
    }
    std::uint64_t lt = 0, gt = 0, nul = 0;
    for (int k = 0; k < 64; k += 16) {
      const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i + k));
      const auto mask = [&](char c) {
        return std::uint64_t{static_cast<std::uint16_t>(
                   _mm_movemask_epi8(_mm_cmpeq_epi8(v, _mm_set1_epi8(c))))}
               << k;
      };
      lt |= mask('<');
      gt |= mask('>');
      nul |= mask('\0');
    }
    strip_segments(in + i, lt, gt, nul, out, d, o, copy_sse2{});
  }
  *depth = d;
  *written = o;
  return i;
}

ZUL_AVX2 std::size_t strip_tags_avx2(const std::uint8_t* in, std::size_t n, std::uint8_t* out,
                                     std::int64_t* depth, std::size_t* written) noexcept {
  const __m256i open = _mm256_set1_epi8('<'), close = _mm256_set1_epi8('>');
  const __m256i zero = _mm256_setzero_si256();
  std::int64_t d = *depth;
  std::size_t i = 0, o = 0;
  for (; n - i >= 128; i += 64) {
    const __m256i a = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i));
    const __m256i b = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i + 32));
    const __m256i any = _mm256_or_si256(
        _mm256_or_si256(_mm256_or_si256(_mm256_cmpeq_epi8(a, open), _mm256_cmpeq_epi8(a, close)),
                        _mm256_cmpeq_epi8(a, zero)),
        _mm256_or_si256(_mm256_or_si256(_mm256_cmpeq_epi8(b, open), _mm256_cmpeq_epi8(b, close)),
                        _mm256_cmpeq_epi8(b, zero)));
    if (_mm256_testz_si256(any, any)) {
      if (d == 0) {
        copy_avx2{}(out + o, in + i);
        o += 64;
      }
      continue;
    }
    const auto mask = [](__m256i x, __m256i y) ZUL_AVX2 {
      return std::uint64_t{static_cast<std::uint32_t>(_mm256_movemask_epi8(x))} |
             std::uint64_t{static_cast<std::uint32_t>(_mm256_movemask_epi8(y))} << 32;
    };
    strip_segments(in + i, mask(_mm256_cmpeq_epi8(a, open), _mm256_cmpeq_epi8(b, open)),
                   mask(_mm256_cmpeq_epi8(a, close), _mm256_cmpeq_epi8(b, close)),
                   mask(_mm256_cmpeq_epi8(a, zero), _mm256_cmpeq_epi8(b, zero)), out, d, o,
                   copy_avx2{});
  }
  *depth = d;
  *written = o;
  return i;
}

}  // namespace

const tag_kernels kStripTagsSse2{strip_tags_sse2};
const tag_kernels kStripTagsAvx2{strip_tags_avx2};

}  // namespace zul::encodings::detail

#endif  // x86-64
