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
// for two empty texts, 1.0 when one text is empty or nothing matches. Uses
// la + lb bytes of flags; when the flags of a (la bytes) or of b (lb bytes)
// cannot be allocated the result is 0.0 with that byte count.
distance_result jaro_winkler_distance(code_points a, code_points b) noexcept;

// The restricted edit distance d of a and b (insertions, deletions,
// substitutions and swaps of two adjacent characters, each costing 1, no
// character edited twice), or nothing when the work buffer of
// edit_distance_work_bytes(a.size(), b.size()) bytes cannot be allocated.
// Memory grows with the shorter text only.
std::optional<std::int64_t> edit_distance(code_points a, code_points b) noexcept;
std::int64_t edit_distance_work_bytes(std::size_t la, std::size_t lb) noexcept;

// d divided by the shorter length, computed as 1.0 / (min(la, lb) / d): 0.0
// for equal texts, 1.0 when either text is empty, above 1.0 when the longer
// text is much longer ("a" against "bcdef" gives 5.0). When the work buffer
// cannot be allocated the result is 1.0 with its byte count.
distance_result levenshtein_distance(code_points a, code_points b) noexcept;

namespace detail {
// Row-by-row dynamic programme over three rows of min(la, lb) + 1 cells; the
// reference for the bit-vector version. Throws std::bad_alloc.
std::int64_t edit_distance_rows(code_points a, code_points b);
// Bit-vector version, 64 pattern characters per step, one byte of state per
// text character; both texts non-empty. Throws std::bad_alloc.
std::int64_t edit_distance_bits(code_points pattern, code_points text);
}  // namespace detail

}  // namespace zul::search
