// Counting kernels for the SSE2 baseline of x86-64, the same methods as the
// wider kernels (search/count_kernels_x86.cpp) on 16-byte vectors: 8-bit
// lane counters flushed with SAD every 255 rounds for one byte, and a
// first-byte and last-byte filter before the full check for longer patterns.
#include "search/count_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <emmintrin.h>

#include <cstring>

namespace zul::search::detail {

std::uint64_t count_byte_sse2(const std::uint8_t* p, std::size_t n, std::uint8_t b) noexcept {
  const __m128i needle = _mm_set1_epi8(static_cast<char>(b));
  const __m128i zero = _mm_setzero_si128();
  __m128i total = zero;
  std::size_t i = 0;
  while (n - i >= 64) {
    // Four independent counters, each bumped at most once per round.
    __m128i c0 = zero, c1 = zero, c2 = zero, c3 = zero;
    std::size_t rounds = (n - i) / 64;
    if (rounds > 255) rounds = 255;
    for (std::size_t k = 0; k < rounds; ++k, i += 64) {
      const auto* v = reinterpret_cast<const __m128i*>(p + i);
      c0 = _mm_sub_epi8(c0, _mm_cmpeq_epi8(_mm_loadu_si128(v), needle));
      c1 = _mm_sub_epi8(c1, _mm_cmpeq_epi8(_mm_loadu_si128(v + 1), needle));
      c2 = _mm_sub_epi8(c2, _mm_cmpeq_epi8(_mm_loadu_si128(v + 2), needle));
      c3 = _mm_sub_epi8(c3, _mm_cmpeq_epi8(_mm_loadu_si128(v + 3), needle));
    }
    total = _mm_add_epi64(total, _mm_add_epi64(_mm_sad_epu8(c0, zero), _mm_sad_epu8(c1, zero)));
    total = _mm_add_epi64(total, _mm_add_epi64(_mm_sad_epu8(c2, zero), _mm_sad_epu8(c3, zero)));
  }
  std::uint64_t count = 0;
  for (; n - i >= 16; i += 16) {
    const __m128i eq =
        _mm_cmpeq_epi8(_mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i)), needle);
    count +=
        static_cast<unsigned>(__builtin_popcount(static_cast<unsigned>(_mm_movemask_epi8(eq))));
  }
  alignas(16) std::uint64_t sums[2];
  _mm_store_si128(reinterpret_cast<__m128i*>(sums), total);
  return count + sums[0] + sums[1] + count_byte_scalar(p + i, n - i, b);
}

std::uint64_t count_pattern_sse2(const std::uint8_t* p, std::size_t n, const std::uint8_t* find,
                                 std::size_t m) noexcept {
  if (m > n) return 0;
  const __m128i first = _mm_set1_epi8(static_cast<char>(find[0]));
  const __m128i last = _mm_set1_epi8(static_cast<char>(find[m - 1]));
  std::uint64_t count = 0;
  std::size_t next = 0, i = 0;
  // Positions i..i+15 need bytes up to i + 15 + m - 1 < n.
  for (; i + 16 + m - 1 <= n; i += 16) {
    const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i));
    const __m128i z = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i + m - 1));
    const __m128i both = _mm_and_si128(_mm_cmpeq_epi8(a, first), _mm_cmpeq_epi8(z, last));
    auto candidates = static_cast<unsigned>(_mm_movemask_epi8(both));
    check_candidates(candidates, 0, i, p, find, m, next, count);
  }
  return count + count_pattern_from(p, n, find, m, i, next);
}

}  // namespace zul::search::detail
#endif
