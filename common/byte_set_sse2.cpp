// Byte-set search for the SSE2 baseline of x86-64. SSE2 has no byte
// shuffle, so membership is tested range by range: a one-byte range with an
// equality compare, a wider range first..last with one subtraction and one
// signed compare (v - first + 128, as a signed byte, is below
// last - first - 127 exactly when (v - first) mod 256 <= last - first).
// A set of more ranges than the set keeps goes to the scalar path.
#include "common/byte_set.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <emmintrin.h>

namespace zul::simd::detail {
namespace {

struct ranges128 {
  __m128i single[byte_set::kMaxRanges];  // the byte of each one-byte range
  __m128i first[byte_set::kMaxRanges];   // first - 128 of each wider range
  __m128i limit[byte_set::kMaxRanges];   // last - first - 127
  std::size_t singles = 0, spans = 0;
};

// 0xFF in each lane of v[0..N) whose byte is a member. Each range's
// constants are loaded once for all N vectors.
template <std::size_t N>
inline void members128(const ranges128& r, const __m128i (&v)[N], __m128i (&any)[N]) {
  for (std::size_t j = 0; j < N; ++j) any[j] = _mm_setzero_si128();
  for (std::size_t k = 0; k < r.singles; ++k) {
    const __m128i single = r.single[k];
    for (std::size_t j = 0; j < N; ++j) any[j] = _mm_or_si128(any[j], _mm_cmpeq_epi8(v[j], single));
  }
  for (std::size_t k = 0; k < r.spans; ++k) {
    const __m128i first = r.first[k], limit = r.limit[k];
    for (std::size_t j = 0; j < N; ++j) {
      any[j] = _mm_or_si128(any[j], _mm_cmpgt_epi8(limit, _mm_sub_epi8(v[j], first)));
    }
  }
}

inline unsigned mask128(const ranges128& r, const std::uint8_t* p) {
  const __m128i v[1] = {_mm_loadu_si128(reinterpret_cast<const __m128i*>(p))};
  __m128i any[1];
  members128(r, v, any);
  return static_cast<unsigned>(_mm_movemask_epi8(any[0]));
}

}  // namespace

std::size_t find_first_in_set_sse2(const byte_set& set, const std::uint8_t* p,
                                   std::size_t n) noexcept {
  if (set.range_count() == 0) return n;
  if (n < 16 || set.range_count() > byte_set::kMaxRanges) {
    return find_first_in_set_scalar(set, p, n);
  }
  ranges128 r;
  for (std::size_t k = 0; k < set.range_count(); ++k) {
    const unsigned first = set.first(k), width = set.last(k) - first;
    if (width == 255) return 0;  // every byte value: n >= 16 here
    if (width == 0) {
      r.single[r.singles++] = _mm_set1_epi8(static_cast<char>(first));
    } else {
      r.first[r.spans] = _mm_set1_epi8(static_cast<char>(first - 128));
      r.limit[r.spans++] = _mm_set1_epi8(static_cast<char>(static_cast<int>(width) - 127));
    }
  }
  std::size_t i = 0;
  for (; n - i >= 64; i += 64) {
    const auto* q = reinterpret_cast<const __m128i*>(p + i);
    const __m128i v[4] = {_mm_loadu_si128(q), _mm_loadu_si128(q + 1), _mm_loadu_si128(q + 2),
                          _mm_loadu_si128(q + 3)};
    __m128i any[4];
    members128(r, v, any);
    const __m128i all = _mm_or_si128(_mm_or_si128(any[0], any[1]), _mm_or_si128(any[2], any[3]));
    if (_mm_movemask_epi8(all) != 0) {
      std::uint64_t bits = 0;
      for (std::size_t j = 0; j < 4; ++j) {
        bits |= std::uint64_t{static_cast<unsigned>(_mm_movemask_epi8(any[j]))} << (16 * j);
      }
      return i + static_cast<std::size_t>(__builtin_ctzll(bits));
    }
  }
  for (; n - i >= 16; i += 16) {
    if (const unsigned m = mask128(r, p + i)) return i + __builtin_ctz(m);
  }
  if (i == n) return n;
  // One overlapping vector ends at n: no earlier byte matched.
  const unsigned m = mask128(r, p + n - 16);
  return m ? n - 16 + __builtin_ctz(m) : n;
}

}  // namespace zul::simd::detail
#endif
