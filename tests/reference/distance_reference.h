// The string distances as first written, kept as the references that tests,
// fuzz targets and benchmarks compare the shipped versions with: a quadratic
// Jaro-Winkler over flag arrays and a row-by-row edit distance. Not linked
// into the plug-in.
#pragma once

#include <cstdint>
#include <span>

namespace zul::reference {

// 1.0 minus the Jaro-Winkler similarity, by the textbook steps: for each
// character of a in order, the first unmatched equal character of b within
// the match window floor(max(la, lb) / 2) - 1; transpositions are half the
// matched pairs that differ (rounded down); the Winkler boost of 0.1 per
// common prefix character (at most 4) applies above a similarity of 0.7.
// 0.0 for two empty texts, 1.0 when exactly one is empty.
double jaro_winkler_distance_reference(std::span<const std::uint32_t> a,
                                       std::span<const std::uint32_t> b);

// The restricted edit distance (Levenshtein plus swaps of two adjacent
// characters, no character edited twice) over three rows of the shorter
// length; the length of the other text when one is empty.
std::int64_t edit_distance_reference(std::span<const std::uint32_t> a,
                                     std::span<const std::uint32_t> b);

}  // namespace zul::reference
