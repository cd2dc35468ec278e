// Counting kernels for x86-64 (AVX2, AVX-512 BW), compiled per function.
//
// One byte: each vector's compare gives 0xFF (-1) per equal lane, which is
// subtracted from 8-bit lane counters; four vectors a round, each into its
// own counter so the rounds pipeline; after at most 255 rounds the counters
// are summed into 64-bit lanes with SAD against zero and cleared.
//
// Longer patterns: a position is a candidate when its byte equals the
// pattern's first byte and the byte m - 1 further on equals its last byte;
// both compares cover a whole block of positions at once, and only
// candidates, in order, are checked in full. A block holds only positions
// whose whole pattern lies inside the input; the scalar path continues from
// the first position after the blocks with the non-overlapping state.
#include <cstring>

#include "search/count_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"

namespace zul::search::detail {

ZUL_AVX2 std::uint64_t count_byte_avx2(const std::uint8_t* p, std::size_t n,
                                       std::uint8_t b) noexcept {
  const __m256i needle = _mm256_set1_epi8(static_cast<char>(b));
  const __m256i zero = _mm256_setzero_si256();
  __m256i total = zero;
  std::uint64_t count = 0;
  std::size_t i = 0;
  if (n >= 256) {
    // Bytes up to the next 64-byte boundary from one unaligned vector: the
    // rounds then read whole cache lines (a load across two lines costs two).
    i = (64 - (reinterpret_cast<std::uintptr_t>(p) & 63)) & 63;
    const __m256i eq =
        _mm256_cmpeq_epi8(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(p)), needle);
    const std::uint64_t head = static_cast<std::uint32_t>(_mm256_movemask_epi8(eq));
    count =
        static_cast<std::uint64_t>(__builtin_popcountll(head & ((1ull << (i < 32 ? i : 32)) - 1)));
    if (i > 32) count += count_byte_scalar(p + 32, i - 32, b);
  }
  while (n - i >= 128) {
    // Four independent counters, so the compares of one round do not wait
    // on each other; each lane gains at most 1 per round.
    __m256i c0 = zero, c1 = zero, c2 = zero, c3 = zero;
    std::size_t rounds = (n - i) / 128;
    if (rounds > 255) rounds = 255;
    for (std::size_t k = 0; k < rounds; ++k, i += 128) {
      const auto* v = reinterpret_cast<const __m256i*>(p + i);
      c0 = _mm256_sub_epi8(c0, _mm256_cmpeq_epi8(_mm256_loadu_si256(v), needle));
      c1 = _mm256_sub_epi8(c1, _mm256_cmpeq_epi8(_mm256_loadu_si256(v + 1), needle));
      c2 = _mm256_sub_epi8(c2, _mm256_cmpeq_epi8(_mm256_loadu_si256(v + 2), needle));
      c3 = _mm256_sub_epi8(c3, _mm256_cmpeq_epi8(_mm256_loadu_si256(v + 3), needle));
    }
    const __m256i s01 = _mm256_add_epi64(_mm256_sad_epu8(c0, zero), _mm256_sad_epu8(c1, zero));
    const __m256i s23 = _mm256_add_epi64(_mm256_sad_epu8(c2, zero), _mm256_sad_epu8(c3, zero));
    total = _mm256_add_epi64(total, _mm256_add_epi64(s01, s23));
  }
  for (; n - i >= 32; i += 32) {
    const __m256i eq =
        _mm256_cmpeq_epi8(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(p + i)), needle);
    count += static_cast<std::uint64_t>(
        __builtin_popcount(static_cast<std::uint32_t>(_mm256_movemask_epi8(eq))));
  }
  alignas(32) std::uint64_t sums[4];
  _mm256_store_si256(reinterpret_cast<__m256i*>(sums), total);
  return count + sums[0] + sums[1] + sums[2] + sums[3] + count_byte_scalar(p + i, n - i, b);
}

ZUL_AVX512 std::uint64_t count_byte_avx512(const std::uint8_t* p, std::size_t n,
                                           std::uint8_t b) noexcept {
  const __m512i needle = _mm512_set1_epi8(static_cast<char>(b));
  const __m512i zero = _mm512_setzero_si512();
  const __m512i minus_one = _mm512_set1_epi8(-1);
  __m512i total = zero;
  std::uint64_t count = 0;
  std::size_t i = 0;
  if (n >= 256) {
    // Bytes up to the next 64-byte boundary (a masked load): the rounds then
    // read whole cache lines (a load across two lines costs two).
    i = (64 - (reinterpret_cast<std::uintptr_t>(p) & 63)) & 63;
    const __mmask64 head = _bzhi_u64(~0ull, static_cast<unsigned>(i));
    count = static_cast<std::uint64_t>(__builtin_popcountll(
        _mm512_mask_cmpeq_epi8_mask(head, _mm512_maskz_loadu_epi8(head, p), needle)));
  }
  while (n - i >= 256) {
    __m512i c0 = zero, c1 = zero, c2 = zero, c3 = zero;
    std::size_t rounds = (n - i) / 256;
    if (rounds > 255) rounds = 255;
    for (std::size_t k = 0; k < rounds; ++k, i += 256) {
      const __mmask64 m0 = _mm512_cmpeq_epi8_mask(_mm512_load_si512(p + i), needle);
      const __mmask64 m1 = _mm512_cmpeq_epi8_mask(_mm512_load_si512(p + i + 64), needle);
      const __mmask64 m2 = _mm512_cmpeq_epi8_mask(_mm512_load_si512(p + i + 128), needle);
      const __mmask64 m3 = _mm512_cmpeq_epi8_mask(_mm512_load_si512(p + i + 192), needle);
      c0 = _mm512_mask_sub_epi8(c0, m0, c0, minus_one);
      c1 = _mm512_mask_sub_epi8(c1, m1, c1, minus_one);
      c2 = _mm512_mask_sub_epi8(c2, m2, c2, minus_one);
      c3 = _mm512_mask_sub_epi8(c3, m3, c3, minus_one);
    }
    const __m512i s01 = _mm512_add_epi64(_mm512_sad_epu8(c0, zero), _mm512_sad_epu8(c1, zero));
    const __m512i s23 = _mm512_add_epi64(_mm512_sad_epu8(c2, zero), _mm512_sad_epu8(c3, zero));
    total = _mm512_add_epi64(total, _mm512_add_epi64(s01, s23));
  }
  // Summed through memory: GCC 12's reduce intrinsic trips -Wuninitialized.
  alignas(64) std::uint64_t sums[8];
  _mm512_store_si512(sums, total);
  for (std::uint64_t s : sums) count += s;
  // The last 0..255 bytes: masked loads never touch bytes past the end.
  for (; i < n; i += 64) {
    const std::size_t left = n - i;
    const __mmask64 live =
        left >= 64 ? ~__mmask64{0} : _bzhi_u64(~0ull, static_cast<unsigned>(left));
    count += static_cast<std::uint64_t>(__builtin_popcountll(
        _mm512_mask_cmpeq_epi8_mask(live, _mm512_maskz_loadu_epi8(live, p + i), needle)));
  }
  return count;
}

ZUL_AVX2 std::uint64_t count_pattern_avx2(const std::uint8_t* p, std::size_t n,
                                          const std::uint8_t* find, std::size_t m) noexcept {
  if (m > n) return 0;
  const __m256i first = _mm256_set1_epi8(static_cast<char>(find[0]));
  const __m256i last = _mm256_set1_epi8(static_cast<char>(find[m - 1]));
  std::uint64_t count = 0;
  std::size_t next = 0, i = 0;
  // Positions i..i+31 need bytes up to i + 31 + m - 1 < n.
  for (; i + 32 + m - 1 <= n; i += 32) {
    const __m256i a = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p + i));
    const __m256i z = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p + i + m - 1));
    const __m256i both = _mm256_and_si256(_mm256_cmpeq_epi8(a, first), _mm256_cmpeq_epi8(z, last));
    const auto candidates = static_cast<std::uint32_t>(_mm256_movemask_epi8(both));
    if (candidates != 0) check_candidates(candidates, 0, i, p, find, m, next, count);
  }
  return count + count_pattern_from(p, n, find, m, i, next);
}

ZUL_AVX512 std::uint64_t count_pattern_avx512(const std::uint8_t* p, std::size_t n,
                                              const std::uint8_t* find, std::size_t m) noexcept {
  if (m > n) return 0;
  const __m512i first = _mm512_set1_epi8(static_cast<char>(find[0]));
  const __m512i last = _mm512_set1_epi8(static_cast<char>(find[m - 1]));
  std::uint64_t count = 0;
  std::size_t next = 0, i = 0;
  for (; i + 64 + m - 1 <= n; i += 64) {
    const __mmask64 a = _mm512_cmpeq_epi8_mask(_mm512_loadu_si512(p + i), first);
    const __mmask64 candidates =
        _mm512_mask_cmpeq_epi8_mask(a, _mm512_loadu_si512(p + i + m - 1), last);
    if (candidates != 0) check_candidates(candidates, 0, i, p, find, m, next, count);
  }
  return count + count_pattern_from(p, n, find, m, i, next);
}

}  // namespace zul::search::detail
#endif
