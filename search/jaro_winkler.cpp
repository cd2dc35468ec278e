// Jaro-Winkler over code points without the quadratic search. The greedy
// matching (each character of a, in order, takes the first unmatched equal
// character of b in its window) falls apart by character: a character of b
// can only be taken by an equal character of a, so each character c is
// matched on its own, between the positions of c in a and in b. Windows
// only move right, so for each c the taken positions of b that are still
// in reach always form a run at the front of the untaken ones: one cursor
// per character into its sorted list of positions in b gives exactly the
// greedy matches in O(la + lb). A b of up to 64 characters keeps its
// positions as bit masks in one word instead, with no memory to allocate.
#include <algorithm>
#include <atomic>
#include <bit>
#include <limits>
#include <memory>
#include <new>

#include "search/code_point_masks.h"
#include "search/distance.h"
#include "search/jaro_kernels.h"

namespace zul::search {
namespace {

// The window floor(max / 2) - 1, never below 0.
std::size_t match_window(std::size_t la, std::size_t lb) {
  const std::size_t longest = std::max(la, lb);
  return longest / 2 >= 1 ? longest / 2 - 1 : 0;
}

// The similarity from m matches and the count of matched pairs that differ,
// with the Winkler boost; the order of operations is fixed so that every
// version gives the same double.
double jaro_winkler_from(std::size_t matches, std::size_t crossed, code_points a, code_points b) {
  const std::size_t la = a.size();
  const std::size_t lb = b.size();
  if (matches == 0) return 1.0;
  const auto m = static_cast<double>(matches);
  const auto t = static_cast<double>(crossed / 2);
  double s = ((m - t) / m + (m / static_cast<double>(lb) + m / static_cast<double>(la))) / 3.0;
  if (s > 0.7) {
    const std::size_t limit = std::min<std::size_t>({4, la, lb});
    std::size_t prefix = 0;
    while (prefix < limit && a[prefix] == b[prefix]) ++prefix;
    if (prefix >= 1) s = s + (1.0 - s) * (static_cast<double>(prefix) * 0.1);
  }
  return 1.0 - s;
}

// Counts the matched pairs that differ: the k-th matched character of a
// (matched_a[k]) against the k-th matched position of b (a set bit of
// taken, lowest first).
template <class Char, class Words>
std::size_t count_crossed(const Char* matched_a, std::size_t matches, code_points b, Words taken) {
  std::size_t crossed = 0;
  std::size_t word = 0;
  std::uint64_t bits = taken(0);
  for (std::size_t k = 0; k < matches; ++k) {
    while (bits == 0) bits = taken(++word);
    const std::size_t j = word * 64 + static_cast<std::size_t>(std::countr_zero(bits));
    bits &= bits - 1;
    crossed += matched_a[k] != b[j] ? 1 : 0;
  }
  return crossed;
}

// Dense numbers for the distinct code points of b: bytes through a direct
// table, others through an open-addressing table of at least twice as many
// slots as b has such characters. Index is wide enough for lb.
template <class Index>
class code_point_ids {
 public:
  static constexpr Index kNone = std::numeric_limits<Index>::max();

  // slots: a power of two above twice the wide characters of b, or 0.
  code_point_ids(std::uint32_t* keys, Index* ids, std::size_t slots) noexcept
      : keys_(keys), ids_(ids), mask_(slots - 1) {
    std::fill(direct_, direct_ + 256, kNone);
    std::fill(ids_, ids_ + slots, kNone);
  }

  Index find(std::uint32_t c) const noexcept {
    if (c < 256) return direct_[c];
    if (ids_ == nullptr) return kNone;
    for (std::size_t s = hash(c);; s = (s + 1) & mask_) {
      if (ids_[s] == kNone || keys_[s] == c) return ids_[s];
    }
  }

  // The number of c, given the next free number when c is new.
  Index insert(std::uint32_t c, Index& next) noexcept {
    Index* slot = &direct_[c & 255];
    if (c >= 256) {
      std::size_t s = hash(c);
      while (ids_[s] != kNone && keys_[s] != c) s = (s + 1) & mask_;
      keys_[s] = c;
      slot = &ids_[s];
    }
    if (*slot == kNone) *slot = next++;
    return *slot;
  }

 private:
  std::size_t hash(std::uint32_t c) const noexcept {
    return static_cast<std::size_t>((std::uint64_t{c} * 0x9E3779B97F4A7C15u) >> 32) & mask_;
  }

  Index direct_[256];
  std::uint32_t* keys_;
  Index* ids_;
  std::size_t mask_;
};

// The position-list matcher with indices of type Index (holding positions,
// counts and numbers up to lb, and kNone). Memory, one block: a bit per
// character of b, then per character of b a number, a position, a list
// start and a cursor, and the hash slots for its characters above U+00FF.
template <class Index>
distance_result jaro_winkler_lists_as(code_points a, code_points b) noexcept {
  const std::size_t la = a.size();
  const std::size_t lb = b.size();
  const std::size_t wide = static_cast<std::size_t>(
      std::count_if(b.begin(), b.end(), [](std::uint32_t c) { return c >= 256; }));
  const std::size_t slots = wide == 0 ? 0 : std::bit_ceil(2 * wide + 1);
  const std::size_t words = (lb + 63) / 64;
  const std::size_t bytes = words * sizeof(std::uint64_t) + (4 * lb + 1 + slots) * sizeof(Index) +
                            slots * sizeof(std::uint32_t);
  std::unique_ptr<std::byte[]> memory;
  try {
    memory.reset(new std::byte[bytes]);  // the plain form, as every other work buffer
  } catch (const std::bad_alloc&) {
    return {0.0, static_cast<std::int64_t>(bytes)};
  }
  auto* taken = reinterpret_cast<std::uint64_t*>(memory.get());
  auto* number = reinterpret_cast<Index*>(taken + words);
  Index* position = number + lb;
  Index* start = position + lb;          // lb + 1 list starts
  Index* slot_ids = start + 2 * lb + 1;  // after the cursors
  auto* slot_keys = reinterpret_cast<std::uint32_t*>(slot_ids + slots);
  std::fill(taken, taken + words, 0);

  // Number the characters of b, count each, and list the positions of each
  // in increasing order (a counting sort by number).
  code_point_ids<Index> ids(slot_keys, slots == 0 ? nullptr : slot_ids, slots);
  Index distinct = 0;
  std::fill(start, start + lb + 1, 0);
  for (std::size_t j = 0; j < lb; ++j) {
    number[j] = ids.insert(b[j], distinct);
    ++start[number[j] + 1];
  }
  for (Index d = 0; d < distinct; ++d) start[d + 1] += start[d];
  Index* cursor = start + distinct + 1;  // the fill point, then the match cursor
  std::copy(start, start + distinct, cursor);
  for (std::size_t j = 0; j < lb; ++j) position[cursor[number[j]]++] = static_cast<Index>(j);
  std::copy(start, start + distinct, cursor);

  Index* matched_a = number;  // the numbers are no longer needed
  const std::size_t window = match_window(la, lb);
  const std::size_t reach = std::min(la, lb + window);  // later characters see nothing
  std::size_t matches = 0;
  for (std::size_t i = 0; i < reach; ++i) {
    const Index d = ids.find(a[i]);
    if (d == code_point_ids<Index>::kNone) continue;
    Index p = cursor[d];
    const Index end = start[d + 1];
    while (p < end && position[p] + window < i) ++p;  // out of reach for good
    if (p < end && position[p] <= i + window) {
      const std::size_t j = position[p++];
      taken[j / 64] |= std::uint64_t{1} << (j % 64);
      matched_a[matches++] = static_cast<Index>(a[i]);
    }
    cursor[d] = p;
  }
  const std::size_t crossed =
      count_crossed(matched_a, matches, b, [&](std::size_t w) { return taken[w]; });
  return {jaro_winkler_from(matches, crossed, a, b), 0};
}

}  // namespace

namespace detail {

jaro_counts match_word_scalar(code_points reach, code_points b, std::size_t window) noexcept {
  const code_point_masks masks(b, reach);
  // The window of position i as a mask: bits 0 to window for i = 0; each
  // step shifts it up one, keeping bit 0 while i is within the window of
  // position 0. Bits shifted out at the top are beyond b, and masks have no
  // bits beyond b, so no cut is needed.
  std::uint64_t bound = window >= 63 ? ~std::uint64_t{0} : (std::uint64_t{2} << window) - 1;
  std::uint64_t taken = 0;
  std::uint32_t matched_a[65];  // one spare for the unconditional store
  std::size_t matches = 0;
  for (std::size_t i = 0; i < reach.size(); ++i) {
    const std::uint64_t open = masks(reach[i]) & bound & ~taken;
    taken |= open & (~open + 1);    // the lowest open position, if any
    matched_a[matches] = reach[i];  // kept only when there was one
    matches += open != 0 ? 1 : 0;
    bound = (bound << 1) | (i < window ? 1 : 0);
  }
  const std::size_t crossed =
      count_crossed(matched_a, matches, b, [&](std::size_t) { return taken; });
  return {matches, crossed};
}

const simd::family_tables<jaro_kernels>& jaro_tables() noexcept {
  static constexpr jaro_kernels kScalar{match_word_scalar};
#if defined(__x86_64__) || defined(_M_X64)
  static constexpr jaro_kernels kAvx2{match_word_avx2};
  static constexpr jaro_kernels kAvx512{match_word_avx512};
  static constexpr simd::family_tables<jaro_kernels> kTables{&kScalar, nullptr, &kAvx2, &kAvx512,
                                                             nullptr};
#else
  static constexpr simd::family_tables<jaro_kernels> kTables{&kScalar};
#endif
  return kTables;
}

const jaro_kernels& active_jaro_kernels() noexcept {
  static std::atomic<const jaro_kernels*> cache{nullptr};
  return simd::active(jaro_tables(), cache);
}

distance_result jaro_winkler_word(code_points a, code_points b,
                                  const jaro_kernels& kernels) noexcept {
  const std::size_t window = match_window(a.size(), b.size());
  // Characters of a beyond lb - 1 + window have no position of b in reach.
  const code_points reach = a.first(std::min(a.size(), b.size() + window));
  const jaro_counts counts = kernels.match_word(reach, b, window);
  return {jaro_winkler_from(counts.matches, counts.crossed, a, b), 0};
}

distance_result jaro_winkler_lists(code_points a, code_points b) noexcept {
  if (b.size() < std::numeric_limits<std::uint32_t>::max())
    return jaro_winkler_lists_as<std::uint32_t>(a, b);
  return jaro_winkler_lists_as<std::uint64_t>(a, b);
}

}  // namespace detail

distance_result jaro_winkler_distance(code_points a, code_points b) noexcept {
  if (a.empty()) return {b.empty() ? 0.0 : 1.0, 0};
  if (b.empty()) return {1.0, 0};
  if (b.size() <= 64) return detail::jaro_winkler_word(a, b, detail::active_jaro_kernels());
  return detail::jaro_winkler_lists(a, b);
}

}  // namespace zul::search
