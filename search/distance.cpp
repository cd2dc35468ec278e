// The restricted edit distance as bit vectors (the published bit-vector
// algorithm for Levenshtein and Damerau edit distances, 2003, built on the
// bit-parallel approximate matching of 1999): each column of the matrix is
// held as bit vectors of its vertical, horizontal and diagonal differences,
// 64 rows per machine word, with one extra vector for adjacent swaps. A
// pattern of up to 64 characters fits one word and needs no memory at all;
// longer ones go block by block.
#include "search/distance.h"

#include <algorithm>
#include <memory>
#include <new>

#include "search/code_point_masks.h"

namespace zul::search {

namespace detail {

// Rows are characters of the pattern, columns characters of the text; bit k
// is row k + 1 of the current column. VP/VN: vertical delta +1/-1; HP/HN:
// horizontal delta +1/-1; D0: diagonal delta 0. TR marks rows where swapping
// two adjacent characters gives a zero diagonal delta: pattern[k] equals the
// previous text character, pattern[k-1] the current one, and the diagonal
// delta at row k of the previous column was 1 (its D0 bit clear). Row 0
// grows by one per column, so a 1 is shifted into HP at the bottom.
namespace {
template <class Masks>
std::int64_t edit_distance_with(const Masks& masks, code_points pattern, code_points text) {
  const std::uint64_t last = std::uint64_t{1} << (pattern.size() - 1);
  std::uint64_t vp = ~std::uint64_t{0};  // column 0 grows by one per row
  std::uint64_t vn = 0;
  std::uint64_t d0 = 0;
  std::uint64_t pm_before = 0;  // no previous text character yet
  auto score = static_cast<std::int64_t>(pattern.size());
  for (const std::uint32_t c : text) {
    const std::uint64_t pm = masks(c);
    const std::uint64_t tr = ((~d0 & pm) << 1) & pm_before;
    const std::uint64_t x = pm | vn;
    d0 = (((x & vp) + vp) ^ vp) | x | tr;
    const std::uint64_t hp = vn | ~(d0 | vp);
    const std::uint64_t hn = vp & d0;
    score +=
        static_cast<std::int64_t>((hp & last) != 0) - static_cast<std::int64_t>((hn & last) != 0);
    const std::uint64_t hp_shifted = (hp << 1) | 1;
    const std::uint64_t hn_shifted = hn << 1;
    vn = hp_shifted & d0;
    vp = hn_shifted | ~(hp_shifted | d0);
    pm_before = pm;
  }
  return score;
}
}  // namespace

std::int64_t edit_distance_word(code_points pattern, code_points text) noexcept {
#if defined(__SSE2__)
  // Compares cost more per text character than a table lookup, so they pay
  // when the table's set-up is not spread over a long text, or when the
  // pattern has code points that the table would hash.
  const bool compare = text.size() <= 64 || std::any_of(pattern.begin(), pattern.end(),
                                                        [](std::uint32_t c) { return c >= 256; });
  if (compare && pattern.size() <= short_pattern_masks<2>::kMax) {
    return edit_distance_with(short_pattern_masks<2>(pattern), pattern, text);
  }
  if (compare && pattern.size() <= short_pattern_masks<4>::kMax) {
    return edit_distance_with(short_pattern_masks<4>(pattern), pattern, text);
  }
#endif
  return edit_distance_with(code_point_masks(pattern, text), pattern, text);
}

// The same update on blocks of 64 rows: bit k of a block's vectors is row
// start + k + 1. Taken as one integer per vector, the column update is
// exactly the one-word update: the addition's carry and the one-bit shifts
// of HP, HN and TR cross from each block into the next. The blocks are
// processed one after another, each over the whole text, and the four bits
// that cross into the next block are kept per column in carries, so memory
// is one byte per text character.
std::int64_t edit_distance_blocks(code_points pattern, code_points text) {
  constexpr std::uint8_t kAdd = 1, kHP = 2, kHN = 4, kTR = 8;
  const std::size_t m = pattern.size();
  const std::size_t n = text.size();
  std::unique_ptr<std::uint8_t[]> carries(new std::uint8_t[n]);
  // Above the first block is row 0, whose horizontal delta is always +1.
  std::fill(carries.get(), carries.get() + n, kHP);
  auto score = static_cast<std::int64_t>(m);
  for (std::size_t start = 0; start < m; start += 64) {
    const std::size_t rows = std::min<std::size_t>(64, m - start);
    const code_point_masks masks(pattern.subspan(start, rows), text);
    const bool last_block = start + rows == m;
    const std::uint64_t last = std::uint64_t{1} << (rows - 1);
    std::uint64_t vp = ~std::uint64_t{0};
    std::uint64_t vn = 0;
    std::uint64_t d0 = 0;
    std::uint64_t pm_before = 0;
    for (std::size_t j = 0; j < n; ++j) {
      const std::uint8_t in = carries[j];
      const std::uint64_t pm = masks(text[j]);
      const std::uint64_t swap = ~d0 & pm;
      const std::uint64_t tr = ((swap << 1) | ((in & kTR) ? 1 : 0)) & pm_before;
      const std::uint64_t x = pm | vn;
      const std::uint64_t low = x & vp;
      const std::uint64_t sum1 = low + vp;
      const std::uint64_t sum = sum1 + ((in & kAdd) ? 1 : 0);
      const bool carry = sum1 < low || sum < sum1;
      d0 = (sum ^ vp) | x | tr;
      const std::uint64_t hp = vn | ~(d0 | vp);
      const std::uint64_t hn = vp & d0;
      if (last_block) score += ((hp & last) ? 1 : 0) - ((hn & last) ? 1 : 0);
      const std::uint64_t hp_shifted = (hp << 1) | ((in & kHP) ? 1 : 0);
      const std::uint64_t hn_shifted = (hn << 1) | ((in & kHN) ? 1 : 0);
      vn = hp_shifted & d0;
      vp = hn_shifted | ~(hp_shifted | d0);
      pm_before = pm;
      carries[j] = static_cast<std::uint8_t>((carry ? kAdd : 0) | ((hp >> 63) ? kHP : 0) |
                                             ((hn >> 63) ? kHN : 0) | ((swap >> 63) ? kTR : 0));
    }
  }
  return score;
}

}  // namespace detail

std::int64_t edit_distance_work_bytes(std::size_t la, std::size_t lb) noexcept {
  const std::size_t shorter = std::min(la, lb);
  // One carry byte per character of the shorter text, beyond one word.
  return shorter <= 64 ? 0 : static_cast<std::int64_t>(shorter);
}

std::optional<std::int64_t> edit_distance(code_points a, code_points b) noexcept {
  if (a.empty() || b.empty()) return static_cast<std::int64_t>(std::max(a.size(), b.size()));
  const code_points shorter = a.size() <= b.size() ? a : b;
  const code_points longer = a.size() <= b.size() ? b : a;
  // The distance is symmetric: a short text is the one-word pattern.
  if (shorter.size() <= 64) return detail::edit_distance_word(shorter, longer);
  // The longer text spans the blocks, the shorter one the carries.
  try {
    return detail::edit_distance_blocks(longer, shorter);
  } catch (const std::bad_alloc&) {
    return std::nullopt;
  }
}

distance_result levenshtein_distance(code_points a, code_points b) noexcept {
  if (a.empty() || b.empty()) return {1.0, 0};
  const std::optional<std::int64_t> d = edit_distance(a, b);
  if (!d) return {1.0, edit_distance_work_bytes(a.size(), b.size())};
  // A distance of 0 would divide by zero below (giving 1 / inf); say 0 plainly.
  if (*d == 0) return {0.0, 0};
  const auto shorter = static_cast<double>(std::min(a.size(), b.size()));
  return {1.0 / (shorter / static_cast<double>(*d)), 0};
}

}  // namespace zul::search
