// Jaro-Winkler matching for a b of at most 64 characters with AVX2: b sits
// in two registers of bytes or four of 16-bit lanes, the low bits of each
// character (when every character of b and of the reach of a agrees above
// them), and the mask of b's positions that hold a character is a compare
// of b with that character broadcast and a byte mask. Other texts take the
// scalar table. A reach of up to 64 characters keeps whether each of its
// characters matched in a register (see jaro_steps.h) and counts the pairs
// that differ from the two match masks.
#include "search/jaro_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include <algorithm>

#include "common/targets.h"
#include "search/jaro_steps.h"

namespace zul::search::detail {
namespace {

// The lanes of p below n (at most 8), the others cleared.
ZUL_AVX2 __m256i first_eight(const std::uint32_t* p, std::size_t n, __m256i& live) {
  live = _mm256_cmpgt_epi32(_mm256_set1_epi32(static_cast<int>(std::min<std::size_t>(n, 8))),
                            _mm256_setr_epi32(0, 1, 2, 3, 4, 5, 6, 7));
  return _mm256_maskload_epi32(reinterpret_cast<const int*>(p), live);
}

// The lane width for two texts (b not empty): 8 bits when all their code
// units agree with b's first above the low byte, 16 when they agree above
// the low 16 bits, else 0 (none). Within those lanes, equal lanes are equal
// code points.
ZUL_AVX2 int lane_bits_of(std::span<const std::uint32_t> a, std::span<const std::uint32_t> b) {
  const __m256i first = _mm256_set1_epi32(static_cast<int>(b[0]));
  __m256i acc = _mm256_setzero_si256();
  for (const auto text : {a, b}) {
    std::size_t i = 0;
    for (; i + 8 <= text.size(); i += 8) {
      const __m256i v = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(text.data() + i));
      acc = _mm256_or_si256(acc, _mm256_xor_si256(v, first));
    }
    if (i < text.size()) {
      __m256i live;
      const __m256i v = first_eight(text.data() + i, text.size() - i, live);
      acc = _mm256_or_si256(acc, _mm256_and_si256(_mm256_xor_si256(v, first), live));
    }
  }
  if (_mm256_testz_si256(acc, _mm256_set1_epi32(~0xFF))) return 8;
  if (_mm256_testz_si256(acc, _mm256_set1_epi32(~0xFFFF))) return 16;
  return 0;
}

// b's lanes 8k to 8k + 7 (0 past its end), only the bits in keep.
ZUL_AVX2 __m256i load_eight(std::span<const std::uint32_t> b, std::size_t k, __m256i keep) {
  const std::size_t from = std::min(8 * k, b.size());
  __m256i live;
  return _mm256_and_si256(first_eight(b.data() + from, b.size() - from, live), keep);
}

// The positions of b: those past its end hold 0, which a character may
// equal, so the matchers start with them taken.
inline std::uint64_t positions_of(std::span<const std::uint32_t> b) {
  return b.size() >= 64 ? ~std::uint64_t{0} : (std::uint64_t{1} << b.size()) - 1;
}

// Byte lanes: 32 positions per register.
struct lanes8 {
  __m256i b[2];
  std::uint64_t live;
  ZUL_AVX2 explicit lanes8(std::span<const std::uint32_t> text) : live(positions_of(text)) {
    const __m256i keep = _mm256_set1_epi32(0xFF);
    for (std::size_t h = 0; h < 2; ++h) {
      // Packing interleaves 128-bit halves; the permute puts the 4-byte
      // groups back in order.
      const __m256i ab =
          _mm256_packus_epi32(load_eight(text, 4 * h, keep), load_eight(text, 4 * h + 1, keep));
      const __m256i cd =
          _mm256_packus_epi32(load_eight(text, 4 * h + 2, keep), load_eight(text, 4 * h + 3, keep));
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
  std::uint64_t live;
  ZUL_AVX2 explicit lanes16(std::span<const std::uint32_t> text) : live(positions_of(text)) {
    const __m256i keep = _mm256_set1_epi32(0xFFFF);
    for (std::size_t q = 0; q < 4; ++q) {
      b[q] = _mm256_permute4x64_epi64(
          _mm256_packus_epi32(load_eight(text, 2 * q, keep), load_eight(text, 2 * q + 1, keep)),
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
  std::uint64_t taken = ~positions.live;
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
      matched_a[_mm_popcnt_u64(taken & positions.live)] = reach[start + k];
      taken |= _blsi_u64(open_in[k] & ~taken);
    }
  }
  jaro_counts counts;
  for (std::uint64_t bits = taken & positions.live; bits != 0; bits = _blsr_u64(bits)) {
    counts.crossed += matched_a[counts.matches++] != b[_tzcnt_u64(bits)] ? 1 : 0;
  }
  return counts;
}

// Matching for a reach of at most 64 characters, returning the mask of its
// matched characters. The window shifts up one per character, and while it
// still grows at its lower end it also gains bit 0 (the loop is split
// there).
template <class Positions>
ZUL_AVX2 std::uint64_t match_short(const Positions& positions, std::span<const std::uint32_t> reach,
                                   std::size_t window, std::uint64_t& taken) {
  std::uint64_t bound = window >= 63 ? ~std::uint64_t{0} : (std::uint64_t{2} << window) - 1;
  const std::size_t n = reach.size();
  const std::size_t growing = std::min(window, n);
  std::uint64_t t = ~positions.live;
  std::uint64_t f = 0;
  std::size_t i = 0;
  for (; i + 2 <= growing; i += 2) {
    pick_two(t, f, positions(reach[i]) & bound, positions(reach[i + 1]) & (bound * 2 + 1));
    bound = bound * 4 + 3;
  }
  for (; i < growing; ++i) {
    pick_one(t, f, positions(reach[i]) & bound);
    bound = bound * 2 + 1;
  }
  for (; i + 2 <= n; i += 2) {
    pick_two(t, f, positions(reach[i]) & bound, positions(reach[i + 1]) & (bound * 2));
    bound *= 4;
  }
  for (; i < n; ++i) {
    pick_one(t, f, positions(reach[i]) & bound);
    bound *= 2;
  }
  taken = t & positions.live;
  return f >> (64 - n);  // the first character's flag lowest (n is 1 to 64)
}

template <class Positions>
ZUL_AVX2 jaro_counts match_in(const Positions& positions, std::span<const std::uint32_t> reach,
                              std::span<const std::uint32_t> b, std::size_t window) {
  if (reach.size() > 64) return match_with(positions, reach, b, window);
  std::uint64_t taken = 0;
  const std::uint64_t matched_a = match_short(positions, reach, window, taken);
  return {static_cast<std::size_t>(_mm_popcnt_u64(taken)),
          count_crossed_walk(reach, matched_a, b, taken)};
}

}  // namespace

ZUL_AVX2 jaro_counts match_word_avx2(std::span<const std::uint32_t> reach,
                                     std::span<const std::uint32_t> b,
                                     std::size_t window) noexcept {
  const int bits = lane_bits_of(reach, b);
  if (bits == 8) return match_in(lanes8(b), reach, b, window);
  if (bits == 16) return match_in(lanes16(b), reach, b, window);
  return match_word_scalar(reach, b, window);
}

}  // namespace zul::search::detail

#endif
