// Byte-set search for the SSE2 baseline of x86-64. SSE2 has no byte
// shuffle, so membership is tested range by range: v is in first..last when
// (v - first) mod 256 <= last - first, that is when the unsigned minimum of
// v - first and the width equals v - first. A set of more ranges than the
// set keeps goes to the scalar path.
#include "common/byte_set.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <emmintrin.h>

namespace zul::simd::detail {
namespace {

struct ranges128 {
  __m128i first[byte_set::kMaxRanges];
  __m128i width[byte_set::kMaxRanges];
  std::size_t count;
};

// 0xFF in each lane whose byte is a member.
inline __m128i members128(const ranges128& r, __m128i v) {
  __m128i any = _mm_setzero_si128();
  for (std::size_t k = 0; k < r.count; ++k) {
    const __m128i d = _mm_sub_epi8(v, r.first[k]);
    any = _mm_or_si128(any, _mm_cmpeq_epi8(_mm_min_epu8(d, r.width[k]), d));
  }
  return any;
}

inline unsigned mask128(const ranges128& r, const std::uint8_t* p) {
  const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
  return static_cast<unsigned>(_mm_movemask_epi8(members128(r, v)));
}

}  // namespace

std::size_t find_first_in_set_sse2(const byte_set& set, const std::uint8_t* p,
                                   std::size_t n) noexcept {
  if (set.range_count() == 0) return n;
  if (n < 16 || set.range_count() > byte_set::kMaxRanges) {
    return find_first_in_set_scalar(set, p, n);
  }
  ranges128 r;
  r.count = set.range_count();
  for (std::size_t k = 0; k < r.count; ++k) {
    r.first[k] = _mm_set1_epi8(static_cast<char>(set.first(k)));
    r.width[k] = _mm_set1_epi8(static_cast<char>(set.last(k) - set.first(k)));
  }
  std::size_t i = 0;
  for (; n - i >= 32; i += 32) {
    const __m128i a = members128(r, _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i)));
    const __m128i b = members128(r, _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i + 16)));
    const unsigned m = static_cast<unsigned>(_mm_movemask_epi8(_mm_or_si128(a, b)));
    if (m != 0) {
      const unsigned both = static_cast<unsigned>(_mm_movemask_epi8(a)) |
                            static_cast<unsigned>(_mm_movemask_epi8(b)) << 16;
      return i + static_cast<std::size_t>(__builtin_ctz(both));
    }
  }
  if (n - i >= 16) {
    if (const unsigned m = mask128(r, p + i)) return i + __builtin_ctz(m);
    i += 16;
  }
  if (i == n) return n;
  // One overlapping vector ends at n: no earlier byte matched.
  const unsigned m = mask128(r, p + n - 16);
  return m ? n - 16 + __builtin_ctz(m) : n;
}

}  // namespace zul::simd::detail
#endif
