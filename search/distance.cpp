// Jaro-Winkler and restricted edit distances over code points. The edit
// distance never keeps the whole matrix. The reference keeps three rows of
// the shorter length (the recurrence reads only the two rows before the
// current one; the distance is symmetric, so the shorter text spans a row).
// Calls take a bit-vector version: each column of the matrix is held as bit
// vectors of its vertical, horizontal and diagonal differences, 64 rows per
// machine word, with one extra vector for adjacent swaps.
#include "search/distance.h"

#include <algorithm>
#include <array>
#include <limits>
#include <memory>
#include <new>

namespace zul::search {
namespace {

// Flags for the Jaro matching, one byte per character, zeroed.
std::unique_ptr<std::uint8_t[]> zeroed_flags(std::size_t n) noexcept {
  return std::unique_ptr<std::uint8_t[]>(new (std::nothrow) std::uint8_t[n]());
}

template <class Cell>
std::int64_t edit_distance_rows_as(code_points shorter, code_points longer) {
  const std::size_t n = shorter.size();
  const std::size_t m = longer.size();
  std::unique_ptr<Cell[]> buffer(new Cell[3 * (n + 1)]);
  Cell* before = buffer.get();       // row i - 2
  Cell* previous = before + n + 1;   // row i - 1
  Cell* current = previous + n + 1;  // row i
  for (std::size_t j = 0; j <= n; ++j) previous[j] = static_cast<Cell>(j);
  for (std::size_t i = 1; i <= m; ++i) {
    const std::uint32_t c = longer[i - 1];
    const std::uint32_t c_before = i >= 2 ? longer[i - 2] : 0;
    current[0] = static_cast<Cell>(i);
    for (std::size_t j = 1; j <= n; ++j) {
      const Cell cost = shorter[j - 1] != c ? 1 : 0;
      Cell v = std::min<Cell>(previous[j] + 1, current[j - 1] + 1);
      v = std::min<Cell>(v, previous[j - 1] + cost);
      if (i >= 2 && j >= 2 && c == shorter[j - 2] && c_before == shorter[j - 1]) {
        v = std::min<Cell>(v, before[j - 2] + cost);
      }
      current[j] = v;
    }
    Cell* recycled = before;
    before = previous;
    previous = current;
    current = recycled;
  }
  return static_cast<std::int64_t>(previous[n]);
}

// Match masks of the characters of a pattern of at most 64 code points: bit k
// of mask(c) is set when pattern[k] == c. Bytes index a direct table; other
// code points go to a small open-addressing table (at most 64 keys in 128
// slots, so a probe always ends at the key or an empty slot).
class pattern_masks {
 public:
  explicit pattern_masks(code_points pattern) noexcept {
    for (std::size_t k = 0; k < pattern.size(); ++k) slot_for(pattern[k]) |= std::uint64_t{1} << k;
  }
  std::uint64_t mask(std::uint32_t c) const noexcept {
    if (c < kDirect) return direct_[c];
    for (std::size_t s = hash(c);; s = (s + 1) % kSlots) {
      if (!used_[s]) return 0;
      if (keys_[s] == c) return masks_[s];
    }
  }

 private:
  static constexpr std::size_t kDirect = 256;
  static constexpr std::size_t kSlots = 128;
  static std::size_t hash(std::uint32_t c) noexcept { return (c * 2654435761u) >> 25; }

  std::uint64_t& slot_for(std::uint32_t c) noexcept {
    if (c < kDirect) return direct_[c];
    std::size_t s = hash(c);
    while (used_[s] && keys_[s] != c) s = (s + 1) % kSlots;
    used_[s] = true;
    keys_[s] = c;
    return masks_[s];
  }

  std::array<std::uint64_t, kDirect> direct_{};
  std::array<std::uint32_t, kSlots> keys_{};
  std::array<std::uint64_t, kSlots> masks_{};
  std::array<bool, kSlots> used_{};
};

}  // namespace

namespace detail {

std::int64_t edit_distance_rows(code_points a, code_points b) {
  const code_points shorter = a.size() <= b.size() ? a : b;
  const code_points longer = a.size() <= b.size() ? b : a;
  if (longer.size() < std::numeric_limits<std::uint32_t>::max()) {
    return edit_distance_rows_as<std::uint32_t>(shorter, longer);
  }
  return edit_distance_rows_as<std::uint64_t>(shorter, longer);
}

// The bit-vector algorithm on blocks of 64 rows. Rows are characters of the
// pattern, columns characters of the text; bit k of a block's vectors is row
// start + k + 1 of the current column. VP/VN: vertical delta +1/-1; HP/HN:
// horizontal delta +1/-1; D0: diagonal delta 0. TR marks rows where swapping
// two adjacent characters gives a zero diagonal delta: pattern[k] equals the
// previous text character, pattern[k-1] the current one, and the diagonal
// delta at row k of the previous column was 1 (its D0 bit clear).
//
// Taken as one integer per vector, the column update is exactly the one-word
// update: the addition's carry and the one-bit shifts of HP, HN and TR cross
// from each block into the next. The blocks are processed one after another,
// each over the whole text, and the four bits that cross into the next block
// are kept per column in carries, so memory is one byte per text character.
std::int64_t edit_distance_bits(code_points pattern, code_points text) {
  constexpr std::uint8_t kAdd = 1, kHP = 2, kHN = 4, kTR = 8;
  const std::size_t m = pattern.size();
  const std::size_t n = text.size();
  std::unique_ptr<std::uint8_t[]> carries(new std::uint8_t[n]);
  // Above the first block is row 0, whose horizontal delta is always +1.
  std::fill(carries.get(), carries.get() + n, kHP);
  auto score = static_cast<std::int64_t>(m);
  for (std::size_t start = 0; start < m; start += 64) {
    const std::size_t rows = std::min<std::size_t>(64, m - start);
    const pattern_masks masks(pattern.subspan(start, rows));
    const bool last_block = start + rows == m;
    const std::uint64_t last = std::uint64_t{1} << (rows - 1);
    std::uint64_t vp = ~std::uint64_t{0};  // column 0 grows by one per row
    std::uint64_t vn = 0;
    std::uint64_t d0 = 0;
    std::uint64_t pm_before = 0;  // no previous text character yet
    for (std::size_t j = 0; j < n; ++j) {
      const std::uint8_t in = carries[j];
      const std::uint64_t pm = masks.mask(text[j]);
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
  return static_cast<std::int64_t>(std::min(la, lb));  // one carry byte per text character
}

std::optional<std::int64_t> edit_distance(code_points a, code_points b) noexcept {
  if (a.empty() || b.empty()) return static_cast<std::int64_t>(std::max(a.size(), b.size()));
  // The longer text spans the blocks, the shorter one the carries.
  const code_points shorter = a.size() <= b.size() ? a : b;
  const code_points longer = a.size() <= b.size() ? b : a;
  try {
    return detail::edit_distance_bits(longer, shorter);
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

distance_result jaro_winkler_distance(code_points a, code_points b) noexcept {
  const std::size_t la = a.size();
  const std::size_t lb = b.size();
  if (la == 0) return {lb == 0 ? 0.0 : 1.0, 0};
  if (lb == 0) return {1.0, 0};

  const std::size_t longest = std::max(la, lb);
  const std::size_t window = longest / 2 >= 1 ? longest / 2 - 1 : 0;

  const auto flags_a = zeroed_flags(la);
  if (!flags_a) return {0.0, static_cast<std::int64_t>(la)};
  const auto flags_b = zeroed_flags(lb);
  if (!flags_b) return {0.0, static_cast<std::int64_t>(lb)};

  std::size_t matches = 0;
  for (std::size_t i = 0; i < la; ++i) {
    const std::size_t from = i > window ? i - window : 0;
    const std::size_t to = std::min(i + window + 1, lb);
    for (std::size_t j = from; j < to; ++j) {
      if (!flags_b[j] && b[j] == a[i]) {
        flags_a[i] = flags_b[j] = 1;
        ++matches;
        break;
      }
    }
  }
  if (matches == 0) return {1.0, 0};

  // Pair the matched characters of a and b in order; count the pairs that differ.
  std::size_t crossed = 0;
  std::size_t k = 0;
  for (std::size_t i = 0; i < la; ++i) {
    if (!flags_a[i]) continue;
    while (!flags_b[k]) ++k;
    if (a[i] != b[k]) ++crossed;
    ++k;
  }
  const auto m = static_cast<double>(matches);
  const auto t = static_cast<double>(crossed / 2);
  double s = ((m - t) / m + (m / static_cast<double>(lb) + m / static_cast<double>(la))) / 3.0;

  if (s > 0.7) {
    const std::size_t limit = std::min<std::size_t>({4, la, lb});
    std::size_t prefix = 0;
    while (prefix < limit && a[prefix] == b[prefix]) ++prefix;
    if (prefix >= 1) s = s + (1.0 - s) * (static_cast<double>(prefix) * 0.1);
  }
  return {1.0 - s, 0};
}

}  // namespace zul::search
