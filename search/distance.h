// String distances over code points: the Jaro-Winkler distance (1 minus the
// Jaro-Winkler similarity, prefix boost 0.1 for up to 4 characters above a
// similarity of 0.7) and the restricted edit distance (Levenshtein plus
// adjacent transpositions, "optimal string alignment") scaled by the shorter
// length. Exact code point equality: no folding, no normalisation.
#pragma once

#include <cstdint>
#include <optional>
#include <span>

namespace zul::search {

using code_points = std::span<const std::uint32_t>;

// A distance, or the size in bytes of the work buffer that could not be
// allocated (then value holds the caller's failure result).
struct distance_result {
  double value = 0.0;
  std::int64_t unallocated_bytes = 0;  // 0 when the distance was computed
};

// 1.0 minus the Jaro-Winkler similarity of a and b: 0.0 for equal texts and
// for two empty texts, 1.0 when one text is empty or nothing matches. For
// each character of a in order, the first unmatched equal character of b
// within the window floor(max(la, lb) / 2) - 1 is its match. Nothing is
// allocated when b has at most 64 characters; otherwise about 12 bytes per
// character of b, and when that fails the result is 0.0 with the byte count.
distance_result jaro_winkler_distance(code_points a, code_points b) noexcept;

// The restricted edit distance d of a and b (insertions, deletions,
// substitutions and swaps of two adjacent characters, each costing 1, no
// character edited twice), or nothing when the work buffer of
// edit_distance_work_bytes(a.size(), b.size()) bytes cannot be allocated.
// Nothing is allocated when the shorter text has at most 64 characters.
std::optional<std::int64_t> edit_distance(code_points a, code_points b) noexcept;
std::int64_t edit_distance_work_bytes(std::size_t la, std::size_t lb) noexcept;

// d divided by the shorter length, computed as 1.0 / (min(la, lb) / d): 0.0
// for equal texts, 1.0 when either text is empty, above 1.0 when the longer
// text is much longer ("a" against "bcdef" gives 5.0). When the work buffer
// cannot be allocated the result is 1.0 with its byte count.
distance_result levenshtein_distance(code_points a, code_points b) noexcept;

namespace detail {
// The edit distance with the whole pattern (1 to 64 characters) in one
// machine word; the text may have any length. No allocation.
std::int64_t edit_distance_word(code_points pattern, code_points text) noexcept;
// Bit-vector version, 64 pattern characters per step, one byte of state per
// text character; both texts non-empty. Throws std::bad_alloc.
std::int64_t edit_distance_blocks(code_points pattern, code_points text);

// The two matchers behind jaro_winkler_distance, both texts non-empty: the
// one-word version for b of at most 64 characters (with the matching
// kernels of one instruction-set level), and the version over
// per-character position lists for any length (0.0 with the byte count when
// its work memory cannot be allocated).
struct jaro_kernels;
distance_result jaro_winkler_word(code_points a, code_points b,
                                  const jaro_kernels& kernels) noexcept;
distance_result jaro_winkler_lists(code_points a, code_points b) noexcept;
}  // namespace detail

}  // namespace zul::search
