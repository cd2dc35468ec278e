// Jaro-Winkler matching for a b of at most 64 characters with AVX-512 (F,
// BW). b sits in registers, in the narrowest lanes that hold every
// character of b and of the reach of a (bytes, 16 or 32 bits), so the mask
// of b's positions that hold a character is one compare of b with that
// character broadcast: no table to build or clear, whatever the code
// points. What stays serial is the taken mask: per character of a, AND-NOT,
// lowest set bit, OR; a reach of up to 64 characters takes two characters
// per read of it. Matched pairs are counted by compressing the matched
// characters of both texts to the front and comparing them (VBMI2 bytes or
// 16-bit lanes, else 32-bit lanes), or by a plain walk when there are few.
#include "search/jaro_kernels.h"

// The zero-masked forms of the conversions and inserts are used throughout:
// GCC 12's plain forms start from an undefined register and warn about it.
#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include <algorithm>

#include "common/targets.h"

namespace zul::search::detail {
namespace {

// Up to this many matches a plain walk over the taken bits is quicker than
// loading the matched characters of a back into vectors, which waits for
// their stores.
constexpr long long kScalarPairs = 16;

// A reach of a up to this long is matched one character at a time.
constexpr std::size_t kShortestPairs = 16;

ZUL_AVX512 inline __mmask16 first_lanes(std::size_t n) {
  return n >= 16 ? static_cast<__mmask16>(0xFFFF) : static_cast<__mmask16>((1u << n) - 1);
}

// The lowest and highest code units of two texts, not both empty.
ZUL_AVX512 void fold_range(const std::uint32_t* p, std::size_t n, __m512i& low, __m512i& high) {
  std::size_t i = 0;
  for (; i + 16 <= n; i += 16) {
    const __m512i v = _mm512_loadu_si512(p + i);
    low = _mm512_maskz_min_epu32(0xFFFF, low, v);
    high = _mm512_maskz_max_epu32(0xFFFF, high, v);
  }
  const __mmask16 live = first_lanes(n - i);
  low = _mm512_mask_min_epu32(low, live, low, _mm512_maskz_loadu_epi32(live, p + i));
  high = _mm512_mask_max_epu32(high, live, high, _mm512_maskz_loadu_epi32(live, p + i));
}

ZUL_AVX512 void fold_lanes(__m512i& low, __m512i& high, const __m512i& other_low,
                           const __m512i& other_high) {
  low = _mm512_maskz_min_epu32(0xFFFF, low, other_low);
  high = _mm512_maskz_max_epu32(0xFFFF, high, other_high);
}

ZUL_AVX512 lane_choice choose_lanes_of(std::span<const std::uint32_t> a,
                                       std::span<const std::uint32_t> b) {
  __m512i low = _mm512_set1_epi32(-1);
  __m512i high = _mm512_setzero_si512();
  fold_range(a.data(), a.size(), low, high);
  fold_range(b.data(), b.size(), low, high);
  // Halve the lanes four times: 128-bit quarters, 64-bit halves, 32 bits.
  // (The shuffles take immediates, so the steps are written out.)
  fold_lanes(low, high, _mm512_maskz_shuffle_i64x2(0xFF, low, low, 0x4E),
             _mm512_maskz_shuffle_i64x2(0xFF, high, high, 0x4E));
  fold_lanes(low, high, _mm512_maskz_shuffle_i64x2(0xFF, low, low, 0xB1),
             _mm512_maskz_shuffle_i64x2(0xFF, high, high, 0xB1));
  fold_lanes(low, high, _mm512_maskz_shuffle_epi32(0xFFFF, low, _MM_PERM_BADC),
             _mm512_maskz_shuffle_epi32(0xFFFF, high, _MM_PERM_BADC));
  fold_lanes(low, high, _mm512_maskz_shuffle_epi32(0xFFFF, low, _MM_PERM_CDAB),
             _mm512_maskz_shuffle_epi32(0xFFFF, high, _MM_PERM_CDAB));
  return choose_lanes(
      static_cast<std::uint32_t>(_mm_cvtsi128_si32(_mm512_maskz_extracti32x4_epi32(0xF, low, 0))),
      static_cast<std::uint32_t>(_mm_cvtsi128_si32(_mm512_maskz_extracti32x4_epi32(0xF, high, 0))));
}

// b in 32-bit lanes, 16 per register; lanes at and beyond lb hold the pad.
struct b_lanes {
  __m512i v[4];
};

// Up to 64 characters in 32-bit lanes, the pad past their end.
ZUL_AVX512 b_lanes load_lanes(std::span<const std::uint32_t> text, __m512i pad) {
  b_lanes w;
  for (std::size_t k = 0; k < 4; ++k) {
    const std::size_t from = std::min(16 * k, text.size());
    w.v[k] = _mm512_mask_loadu_epi32(pad, first_lanes(text.size() - from), text.data() + from);
  }
  return w;
}

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
    return _cvtmask64_u64(
        _mm512_kunpackd(_mm512_cmpeq_epi16_mask(b[1], x), _mm512_cmpeq_epi16_mask(b[0], x)));
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

// The matched pairs that differ, by a walk over both match masks: the
// characters of a at the set bits of matched_a against those of b at the
// set bits of taken, rank by rank (both masks have the same count).
ZUL_AVX512 std::size_t count_crossed_walk(std::span<const std::uint32_t> a, std::uint64_t matched_a,
                                          std::span<const std::uint32_t> b, std::uint64_t taken) {
  std::size_t crossed = 0;
  for (; taken != 0; taken = _blsr_u64(taken), matched_a = _blsr_u64(matched_a)) {
    crossed += a[_tzcnt_u64(matched_a)] != b[_tzcnt_u64(taken)] ? 1 : 0;
  }
  return crossed;
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

// The value as computed, in a register: the compiler may not re-associate
// the ANDs around it. Left alone, it moves the taken mask to the front of
// each chain of ANDs, which lengthens the serial path through it.
ZUL_AVX512 inline std::uint64_t settled(std::uint64_t x) {
  asm("" : "+r"(x));
  return x;
}

// Picks for two characters in a row, both from the same taken mask t: the
// second cannot take the first one's pick, which only an equal character
// can hold, so it removes that pick and nothing else. Two characters cost
// five dependent steps instead of six.
ZUL_AVX512 inline std::uint64_t pick_two(std::uint64_t t, std::uint64_t open0, std::uint64_t open1,
                                         std::uint64_t* picks) {
  // A second copy of t keeps the two ANDNs apart (not one NOT and two ANDs).
  const std::uint64_t p0 = _blsi_u64(_andn_u64(t, open0));
  const std::uint64_t p1 = _blsi_u64(_andn_u64(p0, settled(_andn_u64(settled(t), open1))));
  picks[0] = p0;
  picks[1] = p1;
  return settled(t | p0) | p1;
}

// Matching for a reach of at most 64 characters. Each character's mask is
// found in registers and the taken mask stays in a register; the loop is
// split where the window stops growing at its lower end, so the window
// costs one add per character. The picks are stored and read back once, as
// vectors, for the mask of matched characters of a: cheaper than building
// it bit by bit in the serial loop.
template <class Positions>
ZUL_AVX512 std::uint64_t match_short(const Positions& positions,
                                     std::span<const std::uint32_t> reach, std::size_t window,
                                     std::uint64_t& taken) {
  alignas(64) std::uint64_t picks[64];
  std::uint64_t bound = window >= 63 ? ~std::uint64_t{0} : (std::uint64_t{2} << window) - 1;
  const std::size_t n = reach.size();
  const std::size_t growing = std::min(window, n);
  std::uint64_t t = 0;
  std::size_t i = 0;
  for (; i + 2 <= growing; i += 2) {
    const std::uint64_t open0 = settled(positions(reach[i]) & bound);
    const std::uint64_t open1 = settled(positions(reach[i + 1]) & (bound * 2 + 1));
    t = pick_two(t, open0, open1, picks + i);
    bound = bound * 4 + 3;
  }
  for (; i < growing; ++i) {
    picks[i] = _blsi_u64(_andn_u64(t, settled(positions(reach[i]) & bound)));
    t |= picks[i];
    bound = bound * 2 + 1;
  }
  for (; i + 2 <= n; i += 2) {
    const std::uint64_t open0 = settled(positions(reach[i]) & bound);
    const std::uint64_t open1 = settled(positions(reach[i + 1]) & (bound * 2));
    t = pick_two(t, open0, open1, picks + i);
    bound *= 4;
  }
  for (; i < n; ++i) {
    picks[i] = _blsi_u64(_andn_u64(t, settled(positions(reach[i]) & bound)));
    t |= picks[i];
    bound *= 2;
  }
  std::uint64_t matched_a = 0;
  for (std::size_t k = 0; 8 * k < n; ++k) {
    const std::size_t left = n - 8 * k;
    const auto live = static_cast<__mmask8>(left >= 8 ? 0xFF : (1u << left) - 1);
    const __m512i v = _mm512_maskz_loadu_epi64(live, picks + 8 * k);
    matched_a |= std::uint64_t{_mm512_test_epi64_mask(v, v)} << (8 * k);
  }
  taken = t;
  return matched_a;
}

}  // namespace

ZUL_AVX512 jaro_counts match_word_avx512(std::span<const std::uint32_t> reach,
                                         std::span<const std::uint32_t> b,
                                         std::size_t window) noexcept {
  // Lanes past the end of b hold a pad that equals no character of a or b,
  // so masks need no cut at lb. Characters are compared by their low 8, 16
  // or 32 bits, the fewest that tell them apart (see choose_lanes).
  const lane_choice choice = choose_lanes_of(reach, b);
  if (choice.bits == 0) return match_word_scalar(reach, b, window);
  const __m512i pad = _mm512_set1_epi32(static_cast<int>(choice.pad));
  const b_lanes w = load_lanes(b, pad);
  // Up to 16 characters of a, reading the picks back costs more than the
  // pairs save; beyond 64 they do not fit one mask.
  if (reach.size() > 64 || reach.size() <= kShortestPairs) {
    if (choice.bits == 8) return match_with(lanes8(w), w, reach, b, window);
    if (choice.bits == 16) return match_with(lanes16(w), w, reach, b, window);
    return match_with(lanes32(w), w, reach, b, window);
  }
  // The matched characters of a and the taken positions of b, then the
  // pairs among them that differ.
  jaro_counts counts;
  std::uint64_t taken = 0;
  if (choice.bits == 8) {
    const lanes8 in_b(w);
    const std::uint64_t matched_a = match_short(in_b, reach, window, taken);
    if (_mm_popcnt_u64(taken) > kScalarPairs && simd::has_avx512_vbmi2()) {
      counts.crossed =
          count_crossed_bytes(lanes8(load_lanes(reach, pad)).b, matched_a, in_b.b, taken);
    } else {
      counts.crossed = count_crossed_walk(reach, matched_a, b, taken);
    }
  } else if (choice.bits == 16) {
    const lanes16 in_b(w);
    const std::uint64_t matched_a = match_short(in_b, reach, window, taken);
    if (_mm_popcnt_u64(taken) > kScalarPairs && simd::has_avx512_vbmi2()) {
      counts.crossed =
          count_crossed_words(lanes16(load_lanes(reach, pad)).b, matched_a, in_b.b, taken);
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
