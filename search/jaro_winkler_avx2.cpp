// Jaro-Winkler matching for a b of at most 64 characters with AVX2: b sits
// in two registers of bytes or four of 16-bit lanes, the low bits of each
// character (when they tell every character of b and of the reach of a
// apart, see choose_lanes), and the mask of b's positions that hold a
// character is a compare of b with that character broadcast and a byte
// mask. Wider spans of code points take the scalar table. Matched pairs
// are counted over the taken positions of b.
#include "search/jaro_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include <algorithm>

#include "common/targets.h"

namespace zul::search::detail {
namespace {

// The lanes of p below n (at most 8), the others cleared.
ZUL_AVX2 __m256i first_eight(const std::uint32_t* p, std::size_t n, __m256i& live) {
  live = _mm256_cmpgt_epi32(_mm256_set1_epi32(static_cast<int>(std::min<std::size_t>(n, 8))),
                            _mm256_setr_epi32(0, 1, 2, 3, 4, 5, 6, 7));
  return _mm256_maskload_epi32(reinterpret_cast<const int*>(p), live);
}

ZUL_AVX2 lane_choice choose_lanes_of(std::span<const std::uint32_t> a,
                                     std::span<const std::uint32_t> b) {
  const __m256i none = _mm256_set1_epi32(-1);
  __m256i low = none;
  __m256i high = _mm256_setzero_si256();
  for (const auto text : {a, b}) {
    std::size_t i = 0;
    for (; i + 8 <= text.size(); i += 8) {
      const __m256i v = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(text.data() + i));
      low = _mm256_min_epu32(low, v);
      high = _mm256_max_epu32(high, v);
    }
    if (i < text.size()) {
      __m256i live;
      const __m256i v = first_eight(text.data() + i, text.size() - i, live);
      low = _mm256_min_epu32(low, _mm256_blendv_epi8(none, v, live));
      high = _mm256_max_epu32(high, v);  // cleared lanes hold 0
    }
  }
  // Halve the lanes three times: 128-bit halves, 64 bits, 32 bits.
  low = _mm256_min_epu32(low, _mm256_permute2x128_si256(low, low, 1));
  high = _mm256_max_epu32(high, _mm256_permute2x128_si256(high, high, 1));
  low = _mm256_min_epu32(low, _mm256_shuffle_epi32(low, 0x4E));
  high = _mm256_max_epu32(high, _mm256_shuffle_epi32(high, 0x4E));
  low = _mm256_min_epu32(low, _mm256_shuffle_epi32(low, 0xB1));
  high = _mm256_max_epu32(high, _mm256_shuffle_epi32(high, 0xB1));
  return choose_lanes(static_cast<std::uint32_t>(_mm256_cvtsi256_si32(low)),
                      static_cast<std::uint32_t>(_mm256_cvtsi256_si32(high)));
}

// b's lanes 8k to 8k + 7 (the pad past its end), only the bits in keep.
ZUL_AVX2 __m256i load_eight(std::span<const std::uint32_t> b, std::size_t k, __m256i pad,
                            __m256i keep) {
  const std::size_t from = std::min(8 * k, b.size());
  const __m256i live = _mm256_cmpgt_epi32(_mm256_set1_epi32(static_cast<int>(b.size() - from)),
                                          _mm256_setr_epi32(0, 1, 2, 3, 4, 5, 6, 7));
  const __m256i v = _mm256_maskload_epi32(reinterpret_cast<const int*>(b.data() + from), live);
  return _mm256_and_si256(_mm256_blendv_epi8(pad, v, live), keep);
}

// Byte lanes: 32 positions per register.
struct lanes8 {
  __m256i b[2];
  ZUL_AVX2 lanes8(std::span<const std::uint32_t> text, __m256i pad) {
    const __m256i keep = _mm256_set1_epi32(0xFF);
    for (std::size_t h = 0; h < 2; ++h) {
      // Packing interleaves 128-bit halves; the permute puts the 4-byte
      // groups back in order.
      const __m256i ab = _mm256_packus_epi32(load_eight(text, 4 * h, pad, keep),
                                             load_eight(text, 4 * h + 1, pad, keep));
      const __m256i cd = _mm256_packus_epi32(load_eight(text, 4 * h + 2, pad, keep),
                                             load_eight(text, 4 * h + 3, pad, keep));
      b[h] = _mm256_permutevar8x32_epi32(_mm256_packus_epi16(ab, cd),
                                         _mm256_setr_epi32(0, 4, 1, 5, 2, 6, 3, 7));
    }
  }
  ZUL_AVX2 std::uint64_t operator()(std::uint32_t c) const {
    const __m256i x = _mm256_set1_epi8(static_cast<char>(c));
    const auto lo = static_cast<std::uint32_t>(_mm256_movemask_epi8(_mm256_cmpeq_epi8(b[0], x)));
    const auto hi = static_cast<std::uint32_t>(_mm256_movemask_epi8(_mm256_cmpeq_epi8(b[1], x)));
    return std::uint64_t{lo} | std::uint64_t{hi} << 32;
  }
};

// 16-bit lanes: 16 positions per register.
struct lanes16 {
  __m256i b[4];
  ZUL_AVX2 lanes16(std::span<const std::uint32_t> text, __m256i pad) {
    const __m256i keep = _mm256_set1_epi32(0xFFFF);
    for (std::size_t q = 0; q < 4; ++q) {
      b[q] = _mm256_permute4x64_epi64(_mm256_packus_epi32(load_eight(text, 2 * q, pad, keep),
                                                          load_eight(text, 2 * q + 1, pad, keep)),
                                      0xD8);
    }
  }
  ZUL_AVX2 std::uint64_t operator()(std::uint32_t c) const {
    const __m256i x = _mm256_set1_epi16(static_cast<short>(c));
    std::uint64_t m = 0;
    for (int h = 0; h < 2; ++h) {
      const __m256i bytes = _mm256_permute4x64_epi64(
          _mm256_packs_epi16(_mm256_cmpeq_epi16(b[2 * h], x), _mm256_cmpeq_epi16(b[2 * h + 1], x)),
          0xD8);
      m |= std::uint64_t{static_cast<std::uint32_t>(_mm256_movemask_epi8(bytes))} << (32 * h);
    }
    return m;
  }
};

template <class Positions>
ZUL_AVX2 jaro_counts match_with(const Positions& positions, std::span<const std::uint32_t> reach,
                                std::span<const std::uint32_t> b, std::size_t window) {
  // bits max(0, i - window) to i + window of b: the window of position i.
  std::uint64_t bound = window >= 63 ? ~std::uint64_t{0} : (std::uint64_t{2} << window) - 1;
  std::uint64_t taken = 0;
  std::uint32_t matched_a[65];  // one spare for the unconditional store
  std::uint64_t open_in[16];    // masks found apart from the serial chain
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
  jaro_counts counts;
  for (std::uint64_t bits = taken; bits != 0; bits = _blsr_u64(bits)) {
    counts.crossed += matched_a[counts.matches++] != b[_tzcnt_u64(bits)] ? 1 : 0;
  }
  return counts;
}

}  // namespace

ZUL_AVX2 jaro_counts match_word_avx2(std::span<const std::uint32_t> reach,
                                     std::span<const std::uint32_t> b,
                                     std::size_t window) noexcept {
  const lane_choice choice = choose_lanes_of(reach, b);
  const __m256i pad = _mm256_set1_epi32(static_cast<int>(choice.pad));
  if (choice.bits == 8) return match_with(lanes8(b, pad), reach, b, window);
  if (choice.bits == 16) return match_with(lanes16(b, pad), reach, b, window);
  return match_word_scalar(reach, b, window);
}

}  // namespace zul::search::detail

#endif
