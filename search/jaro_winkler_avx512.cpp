// Jaro-Winkler matching for a b of at most 64 characters with AVX-512 (F,
// BW). b sits in registers, in the narrowest lanes that hold every
// character of b and of the reach of a (bytes, 16 or 32 bits), so the mask
// of b's positions that hold a character is one compare of b with that
// character broadcast: no table to build or clear, whatever the code
// points. What stays serial is the taken mask: per character of a, AND-NOT,
// lowest set bit, OR. Matched pairs are counted by compressing the taken
// characters of b to the front and comparing them with the matched
// characters of a, 16 at a time (by a plain walk when there are few).
#include "search/jaro_kernels.h"

// The zero-masked forms of the conversions and inserts are used throughout:
// GCC 12's plain forms start from an undefined register and warn about it.
#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include <algorithm>

#define ZUL_AVX512 \
  __attribute__((target("avx2,bmi,bmi2,popcnt,avx512f,avx512bw,avx512vl,avx512dq")))

namespace zul::search::detail {
namespace {

// Up to this many matches a plain walk over the taken bits is quicker than
// loading the matched characters of a back into vectors, which waits for
// their stores.
constexpr long long kScalarPairs = 16;

ZUL_AVX512 inline __mmask16 first_lanes(std::size_t n) {
  return n >= 16 ? static_cast<__mmask16>(0xFFFF) : static_cast<__mmask16>((1u << n) - 1);
}

// The OR of the code units of p[0..n): its highest bit bounds them all.
ZUL_AVX512 __m512i or_of(const std::uint32_t* p, std::size_t n) {
  __m512i m = _mm512_setzero_si512();
  std::size_t i = 0;
  for (; i + 16 <= n; i += 16) m = _mm512_or_si512(m, _mm512_loadu_si512(p + i));
  return _mm512_or_si512(m, _mm512_maskz_loadu_epi32(first_lanes(n - i), p + i));
}

// b in 32-bit lanes, 16 per register; lanes at and beyond lb hold the pad.
struct b_lanes {
  __m512i v[4];
};

// Position masks with b in byte lanes: one register, one compare.
struct lanes8 {
  __m512i b;
  ZUL_AVX512 explicit lanes8(const b_lanes& w) {
    const __m512i lo = _mm512_maskz_inserti32x4(
        0xFFFF,
        _mm512_maskz_inserti32x4(0xFFFF, _mm512_setzero_si512(),
                                 _mm512_maskz_cvtepi32_epi8(0xFFFF, w.v[0]), 0),
        _mm512_maskz_cvtepi32_epi8(0xFFFF, w.v[1]), 1);
    const __m512i hi =
        _mm512_maskz_inserti32x4(0xFFFF, lo, _mm512_maskz_cvtepi32_epi8(0xFFFF, w.v[2]), 2);
    b = _mm512_maskz_inserti32x4(0xFFFF, hi, _mm512_maskz_cvtepi32_epi8(0xFFFF, w.v[3]), 3);
  }
  ZUL_AVX512 std::uint64_t operator()(std::uint32_t c) const {
    return _mm512_cmpeq_epi8_mask(b, _mm512_set1_epi8(static_cast<char>(c)));
  }
};

// 16-bit lanes: two registers of 32.
struct lanes16 {
  __m512i b[2];
  ZUL_AVX512 explicit lanes16(const b_lanes& w) {
    for (int h = 0; h < 2; ++h) {
      b[h] = _mm512_maskz_inserti64x4(
          0xFF,
          _mm512_maskz_inserti64x4(0xFF, _mm512_setzero_si512(),
                                   _mm512_maskz_cvtepi32_epi16(0xFFFF, w.v[2 * h]), 0),
          _mm512_maskz_cvtepi32_epi16(0xFFFF, w.v[2 * h + 1]), 1);
    }
  }
  ZUL_AVX512 std::uint64_t operator()(std::uint32_t c) const {
    const __m512i x = _mm512_set1_epi16(static_cast<short>(c));
    return std::uint64_t{_mm512_cmpeq_epi16_mask(b[0], x)} |
           std::uint64_t{_mm512_cmpeq_epi16_mask(b[1], x)} << 32;
  }
};

// Whole code points: four registers of 16.
struct lanes32 {
  const b_lanes& w;
  ZUL_AVX512 explicit lanes32(const b_lanes& lanes) : w(lanes) {}
  ZUL_AVX512 std::uint64_t operator()(std::uint32_t c) const {
    const __m512i x = _mm512_set1_epi32(static_cast<int>(c));
    std::uint64_t m = 0;
    for (int k = 0; k < 4; ++k) {
      m |= std::uint64_t{_mm512_cmpeq_epi32_mask(w.v[k], x)} << (16 * k);
    }
    return m;
  }
};

template <class Positions>
ZUL_AVX512 jaro_counts match_with(const Positions& positions, const b_lanes& w,
                                  std::span<const std::uint32_t> reach,
                                  std::span<const std::uint32_t> b, std::size_t window) {
  // bits max(0, i - window) to i + window of b: the window of position i.
  std::uint64_t bound = window >= 63 ? ~std::uint64_t{0} : (std::uint64_t{2} << window) - 1;
  std::uint64_t taken = 0;
  // The k-th matched character of a goes to index k; a character without a
  // match is written there and overwritten by the next one.
  alignas(64) std::uint32_t matched_a[80];
  // Masks of 16 characters are found first, apart from the serial chain,
  // so that their compares overlap instead of queueing behind it.
  std::uint64_t open_in[16];
  for (std::size_t start = 0; start < reach.size(); start += 16) {
    const std::size_t n = std::min<std::size_t>(16, reach.size() - start);
    for (std::size_t k = 0; k < n; ++k) {
      const std::size_t i = start + k;
      open_in[k] = positions(reach[i]) & bound;
      bound = (bound << 1) | (i < window ? 1 : 0);
    }
    for (std::size_t k = 0; k < n; ++k) {
      matched_a[_mm_popcnt_u64(taken)] = reach[start + k];
      taken |= _blsi_u64(open_in[k] & ~taken);
    }
  }
  // The taken characters of each register of b, compressed to its front,
  // against the matched characters of a of the same ranks.
  jaro_counts counts;
  if (_mm_popcnt_u64(taken) <= kScalarPairs) {
    for (std::uint64_t bits = taken; bits != 0; bits = _blsr_u64(bits)) {
      counts.crossed += matched_a[counts.matches++] != b[_tzcnt_u64(bits)] ? 1 : 0;
    }
    return counts;
  }
  for (int k = 0; k < 4; ++k) {
    const auto part = static_cast<__mmask16>(taken >> (16 * k));
    const __mmask16 live = first_lanes(static_cast<std::size_t>(_mm_popcnt_u32(part)));
    const __m512i from_b = _mm512_maskz_compress_epi32(part, w.v[k]);
    const __m512i from_a = _mm512_maskz_loadu_epi32(live, matched_a + counts.matches);
    counts.crossed += static_cast<std::size_t>(
        _mm_popcnt_u32(_mm512_mask_cmpneq_epi32_mask(live, from_a, from_b)));
    counts.matches += static_cast<std::size_t>(_mm_popcnt_u32(part));
  }
  return counts;
}

}  // namespace

ZUL_AVX512 jaro_counts match_word_avx512(std::span<const std::uint32_t> reach,
                                         std::span<const std::uint32_t> b,
                                         std::size_t window) noexcept {
  // Lanes past the end of b hold a pad that equals no character of a or b:
  // a bit that none of them has, so masks need no cut at lb. The narrowest
  // lanes with such a bit to spare are used.
  alignas(64) std::uint32_t lanes[16];
  _mm512_store_si512(lanes,
                     _mm512_or_si512(or_of(b.data(), b.size()), or_of(reach.data(), reach.size())));
  std::uint32_t used = 0;
  for (const std::uint32_t lane : lanes) used |= lane;
  const lane_choice choice = choose_lanes(used);
  if (choice.bits == 0) return match_word_scalar(reach, b, window);
  const __m512i pad = _mm512_set1_epi32(static_cast<int>(choice.pad));
  b_lanes w;
  for (std::size_t k = 0; k < 4; ++k) {
    const std::size_t from = std::min(16 * k, b.size());
    w.v[k] = _mm512_mask_loadu_epi32(pad, first_lanes(b.size() - from), b.data() + from);
  }
  if (choice.bits == 8) return match_with(lanes8(w), w, reach, b, window);
  if (choice.bits == 16) return match_with(lanes16(w), w, reach, b, window);
  return match_with(lanes32(w), w, reach, b, window);
}

}  // namespace zul::search::detail

#endif
