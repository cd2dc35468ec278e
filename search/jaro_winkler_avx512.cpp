// Jaro-Winkler matching for a b of at most 64 characters with AVX-512 (F,
// BW). b sits in registers, in the narrowest lanes that tell every
// character of b and of the reach of a apart (bytes, 16 or 32 bits), so the
// mask of b's positions that hold a character is one compare of b with that
// character broadcast, under the window (a mask register with byte lanes):
// no table to build or clear, whatever the code points. What stays serial
// is the taken mask: per character of a, AND-NOT, lowest set bit, OR; a
// reach of up to 64 characters takes two characters per read of it and
// keeps whether each matched in a register as it goes (jaro_steps.h).
// Matched pairs are counted by compressing the matched characters of both
// texts to the front and comparing them (VBMI2 bytes or 16-bit lanes), or
// by a plain walk.
#include "search/jaro_kernels.h"

// The zero-masked forms of the conversions and inserts are used throughout:
// GCC 12's plain forms start from an undefined register and warn about it.
#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include <algorithm>

#include "common/targets.h"
#include "search/jaro_steps.h"

namespace zul::search::detail {
namespace {

// Up to this many matches a plain walk over the taken bits is quicker than
// compressing both texts' matched characters in vectors.
constexpr long long kScalarPairs = 16;

ZUL_AVX512 inline __mmask16 first_lanes(std::size_t n) {
  return n >= 16 ? static_cast<__mmask16>(0xFFFF) : static_cast<__mmask16>((1u << n) - 1);
}

// The bits of x ^ first, ORed into acc, for the code units of one text.
ZUL_AVX512 void fold_differences(const std::uint32_t* p, std::size_t n, const __m512i& first,
                                 __m512i& acc) {
  std::size_t i = 0;
  // 0xF6: acc | (x ^ first).
  for (; i + 16 <= n; i += 16) {
    acc = _mm512_ternarylogic_epi32(acc, _mm512_loadu_si512(p + i), first, 0xF6);
  }
  const __m512i tail = _mm512_mask_loadu_epi32(first, first_lanes(n - i), p + i);
  acc = _mm512_ternarylogic_epi32(acc, tail, first, 0xF6);
}

// The lane width for two texts (b not empty): 8 bits when all their code
// units agree above the low byte, 16 when they agree above the low 16 bits,
// else 32. Within those lanes, equal lanes are equal code points.
ZUL_AVX512 int lane_bits_of(std::span<const std::uint32_t> a, std::span<const std::uint32_t> b) {
  const __m512i first = _mm512_set1_epi32(static_cast<int>(b[0]));
  __m512i acc = _mm512_setzero_si512();
  fold_differences(a.data(), a.size(), first, acc);
  fold_differences(b.data(), b.size(), first, acc);
  if (_mm512_test_epi32_mask(acc, _mm512_set1_epi32(~0xFF)) == 0) return 8;
  if (_mm512_test_epi32_mask(acc, _mm512_set1_epi32(~0xFFFF)) == 0) return 16;
  return 32;
}

// b in 32-bit lanes, 16 per register; lanes at and beyond lb hold 0, and
// the compares leave them out (live).
struct b_lanes {
  __m512i v[4];
  std::uint64_t live;
};

// Up to 64 characters in 32-bit lanes.
ZUL_AVX512 b_lanes load_lanes(std::span<const std::uint32_t> text) {
  b_lanes w;
  for (std::size_t k = 0; k < 4; ++k) {
    const std::size_t from = std::min(16 * k, text.size());
    w.v[k] = _mm512_maskz_loadu_epi32(first_lanes(text.size() - from), text.data() + from);
  }
  w.live = _bzhi_u64(~std::uint64_t{0}, static_cast<unsigned>(text.size()));
  return w;
}

// Position masks with b in byte lanes: one register, one compare.
struct lanes8 {
  __m512i b;
  std::uint64_t live;
  ZUL_AVX512 explicit lanes8(const b_lanes& w) : live(w.live) {
    const __m512i lo = _mm512_maskz_inserti32x4(
        0xFFFF,
        _mm512_maskz_inserti32x4(0xFFFF, _mm512_setzero_si512(),
                                 _mm512_maskz_cvtepi32_epi8(0xFFFF, w.v[0]), 0),
        _mm512_maskz_cvtepi32_epi8(0xFFFF, w.v[1]), 1);
    const __m512i hi =
        _mm512_maskz_inserti32x4(0xFFFF, lo, _mm512_maskz_cvtepi32_epi8(0xFFFF, w.v[2]), 2);
    b = _mm512_maskz_inserti32x4(0xFFFF, hi, _mm512_maskz_cvtepi32_epi8(0xFFFF, w.v[3]), 3);
  }
  // The positions of c in b among those of m.
  ZUL_AVX512 std::uint64_t within(std::uint32_t c, __mmask64 m) const {
    return _mm512_mask_cmpeq_epi8_mask(m, b, _mm512_set1_epi8(static_cast<char>(c)));
  }
  ZUL_AVX512 std::uint64_t operator()(std::uint32_t c) const {
    return within(c, _cvtu64_mask64(live));
  }
};

// 16-bit lanes: two registers of 32.
struct lanes16 {
  __m512i b[2];
  std::uint64_t live;
  ZUL_AVX512 explicit lanes16(const b_lanes& w) : live(w.live) {
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
    const auto low_half = static_cast<__mmask32>(live);
    const auto high_half = static_cast<__mmask32>(live >> 32);
    return _cvtmask64_u64(_mm512_kunpackd(_mm512_mask_cmpeq_epi16_mask(high_half, b[1], x),
                                          _mm512_mask_cmpeq_epi16_mask(low_half, b[0], x)));
  }
};

// Whole code points: four registers of 16.
struct lanes32 {
  const b_lanes& w;
  std::uint64_t live;
  ZUL_AVX512 explicit lanes32(const b_lanes& lanes) : w(lanes), live(lanes.live) {}
  ZUL_AVX512 std::uint64_t operator()(std::uint32_t c) const {
    const __m512i x = _mm512_set1_epi32(static_cast<int>(c));
    std::uint64_t found = 0;
    for (int k = 0; k < 4; ++k) {
      const auto part = static_cast<__mmask16>(live >> (16 * k));
      found |= std::uint64_t{_mm512_mask_cmpeq_epi32_mask(part, w.v[k], x)} << (16 * k);
    }
    return found;
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

// The same count with VBMI2 and the characters of both texts in byte lanes:
// both sides compressed to the front of one register each. Vectors come by
// reference: a function that takes them by value returns with the upper
// register halves in use, which its caller does not expect, and the SSE
// code after it then runs slowly.
ZUL_AVX512_VBMI2 std::size_t count_crossed_bytes(const __m512i& a, std::uint64_t matched_a,
                                                 const __m512i& b, std::uint64_t taken) {
  const __m512i from_a = _mm512_maskz_compress_epi8(matched_a, a);
  const __m512i from_b = _mm512_maskz_compress_epi8(taken, b);
  const __mmask64 live = _bzhi_u64(~std::uint64_t{0}, static_cast<unsigned>(_mm_popcnt_u64(taken)));
  return static_cast<std::size_t>(
      _mm_popcnt_u64(_mm512_mask_cmpneq_epi8_mask(live, from_a, from_b)));
}

// 64 characters in 16-bit lanes (two registers) compressed by a mask, and
// the two fronts joined into one run of 64 lanes: lanes below the count of
// the low half come from it, the others from the high half.
ZUL_AVX512_VBMI2 void compress_words(const __m512i (&v)[2], std::uint64_t mask, __m512i (&out)[2]) {
  const __m512i lo = _mm512_maskz_compress_epi16(static_cast<__mmask32>(mask), v[0]);
  const __m512i hi = _mm512_maskz_compress_epi16(static_cast<__mmask32>(mask >> 32), v[1]);
  const auto count = static_cast<short>(_mm_popcnt_u32(static_cast<std::uint32_t>(mask)));
  const __m512i lane = _mm512_set_epi16(31, 30, 29, 28, 27, 26, 25, 24, 23, 22, 21, 20, 19, 18, 17,
                                        16, 15, 14, 13, 12, 11, 10, 9, 8, 7, 6, 5, 4, 3, 2, 1, 0);
  const __m512i shift = _mm512_set1_epi16(static_cast<short>(32 - count));
  // Index bit 5 picks hi: lanes at and past count read hi from its lane 0.
  const __mmask32 late = _mm512_cmpge_epi16_mask(lane, _mm512_set1_epi16(count));
  out[0] = _mm512_permutex2var_epi16(lo, _mm512_mask_add_epi16(lane, late, lane, shift), hi);
  // Lane k of the second run is lane 32 + k - count of hi (index 64 + k -
  // count, taken modulo 64); the lanes past the total are never compared.
  const __m512i second = _mm512_add_epi16(lane, _mm512_set1_epi16(static_cast<short>(64 - count)));
  out[1] = _mm512_permutex2var_epi16(lo, second, hi);
}

ZUL_AVX512_VBMI2 std::size_t count_crossed_words(const __m512i (&a)[2], std::uint64_t matched_a,
                                                 const __m512i (&b)[2], std::uint64_t taken) {
  __m512i from_a[2];
  __m512i from_b[2];
  compress_words(a, matched_a, from_a);
  compress_words(b, taken, from_b);
  const std::uint64_t live =
      _bzhi_u64(~std::uint64_t{0}, static_cast<unsigned>(_mm_popcnt_u64(taken)));
  const std::uint64_t differ = std::uint64_t{_mm512_mask_cmpneq_epi16_mask(
                                   static_cast<__mmask32>(live), from_a[0], from_b[0])} |
                               std::uint64_t{_mm512_mask_cmpneq_epi16_mask(
                                   static_cast<__mmask32>(live >> 32), from_a[1], from_b[1])}
                                   << 32;
  return static_cast<std::size_t>(_mm_popcnt_u64(differ));
}

// The window of a character of a over b: bits max(0, i - window) to
// i + window. With byte lanes it is a mask register that the compare
// applies for free; wider lanes take two or four compares, where splitting
// the mask register for each costs more than an AND in a general register.
template <class Positions>
struct sliding_window {
  std::uint64_t bits;
  ZUL_AVX512 std::uint64_t open(const Positions& positions, std::uint32_t c) const {
    return positions(c) & bits;
  }
  template <int k>
  ZUL_AVX512 sliding_window slid() const {
    return {bits << k};
  }
  ZUL_AVX512 sliding_window grown() const { return {bits * 2 + 1}; }
};

template <>
struct sliding_window<lanes8> {
  __mmask64 bits;
  ZUL_AVX512 explicit sliding_window(std::uint64_t first) : bits(_cvtu64_mask64(first)) {}
  ZUL_AVX512 explicit sliding_window(__mmask64 m, int) : bits(m) {}
  ZUL_AVX512 std::uint64_t open(const lanes8& positions, std::uint32_t c) const {
    return positions.within(c, bits);
  }
  template <int k>
  ZUL_AVX512 sliding_window slid() const {
    return sliding_window(_kshiftli_mask64(bits, k), 0);
  }
  ZUL_AVX512 sliding_window grown() const {
    return sliding_window(_kor_mask64(_kshiftli_mask64(bits, 1), _cvtu64_mask64(1)), 0);
  }
};

// Matching for a reach of at most 64 characters, returning the mask of its
// matched characters. Each character's mask is found in registers and the
// taken mask stays in a register. The window shifts up one per character,
// and while it still grows at its lower end it also gains bit 0 (the loop
// is split there). Positions past the end of b start out taken, so the
// window needs no cut at lb. Whether each character took a position enters
// f from the top (see pick_one).
template <class Positions>
ZUL_AVX512 std::uint64_t match_short(const Positions& positions,
                                     std::span<const std::uint32_t> reach, std::size_t window,
                                     std::uint64_t& taken) {
  using window_t = sliding_window<Positions>;
  window_t bound{window >= 63 ? ~std::uint64_t{0} : (std::uint64_t{2} << window) - 1};
  const std::size_t n = reach.size();
  const std::size_t growing = std::min(window, n);
  std::uint64_t t = ~positions.live;
  std::uint64_t f = 0;
  std::size_t i = 0;
  for (; i + 2 <= growing; i += 2) {
    const window_t next = bound.grown();
    pick_two(t, f, bound.open(positions, reach[i]), next.open(positions, reach[i + 1]));
    bound = next.grown();
  }
  for (; i < growing; ++i) {
    pick_one(t, f, bound.open(positions, reach[i]));
    bound = bound.grown();
  }
  for (; i + 2 <= n; i += 2) {
    pick_two(t, f, bound.open(positions, reach[i]),
             bound.template slid<1>().open(positions, reach[i + 1]));
    bound = bound.template slid<2>();
  }
  for (; i < n; ++i) {
    pick_one(t, f, bound.open(positions, reach[i]));
    bound = bound.template slid<1>();
  }
  taken = t & positions.live;
  return f >> (64 - n);  // the first character's flag lowest (n is 1 to 64)
}

}  // namespace

ZUL_AVX512 jaro_counts match_word_avx512(std::span<const std::uint32_t> reach,
                                         std::span<const std::uint32_t> b,
                                         std::size_t window) noexcept {
  // Characters are compared by their low 8, 16 or 32 bits, the fewest that
  // tell them apart. The choice only steers branches: the lanes of b do not
  // wait for it.
  const int bits = lane_bits_of(reach, b);
  const b_lanes w = load_lanes(b);
  // A reach beyond 64 characters does not fit one mask.
  if (reach.size() > 64) {
    if (bits == 8) return match_with(lanes8(w), w, reach, b, window);
    if (bits == 16) return match_with(lanes16(w), w, reach, b, window);
    return match_with(lanes32(w), w, reach, b, window);
  }
  // The matched characters of a and the taken positions of b, then the
  // pairs among them that differ.
  jaro_counts counts;
  std::uint64_t taken = 0;
  if (bits == 8) {
    const lanes8 in_b(w);
    const std::uint64_t matched_a = match_short(in_b, reach, window, taken);
    if (_mm_popcnt_u64(taken) > kScalarPairs && simd::has_avx512_vbmi2()) {
      counts.crossed = count_crossed_bytes(lanes8(load_lanes(reach)).b, matched_a, in_b.b, taken);
    } else {
      counts.crossed = count_crossed_walk(reach, matched_a, b, taken);
    }
  } else if (bits == 16) {
    const lanes16 in_b(w);
    const std::uint64_t matched_a = match_short(in_b, reach, window, taken);
    if (_mm_popcnt_u64(taken) > kScalarPairs && simd::has_avx512_vbmi2()) {
      counts.crossed = count_crossed_words(lanes16(load_lanes(reach)).b, matched_a, in_b.b, taken);
    } else {
      counts.crossed = count_crossed_walk(reach, matched_a, b, taken);
    }
  } else {
    const std::uint64_t matched_a = match_short(lanes32(w), reach, window, taken);
    counts.crossed = count_crossed_walk(reach, matched_a, b, taken);
  }
  counts.matches = static_cast<std::size_t>(_mm_popcnt_u64(taken));
  return counts;
}

}  // namespace zul::search::detail

#endif
