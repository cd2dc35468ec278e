// The matching step of Jaro-Winkler for a b of at most 64 characters, as a
// family of kernels chosen once per process: the scalar one-word matcher
// (a table of position masks) and, on x86-64 with AVX2 or AVX-512, ones
// that get each character's positions in b by comparing it with all of b
// at once.
// Tests and benchmarks run every level the machine has.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

#include "common/dispatch.h"

namespace zul::search::detail {

// m, the greedy matches, and the matched pairs that differ (before halving).
struct jaro_counts {
  std::size_t matches = 0;
  std::size_t crossed = 0;
};

struct jaro_kernels {
  // reach: the characters of a that have a position of b in their window
  // (at most lb + window of them); b: 1 to 64 characters. For each
  // character of reach in order, the first untaken equal character of b
  // within the window is taken.
  jaro_counts (*match_word)(std::span<const std::uint32_t> reach, std::span<const std::uint32_t> b,
                            std::size_t window) noexcept;
};

const simd::family_tables<jaro_kernels>& jaro_tables() noexcept;
const jaro_kernels& active_jaro_kernels() noexcept;

jaro_counts match_word_scalar(std::span<const std::uint32_t> reach,
                              std::span<const std::uint32_t> b, std::size_t window) noexcept;
jaro_counts match_word_avx2(std::span<const std::uint32_t> reach, std::span<const std::uint32_t> b,
                            std::size_t window) noexcept;
jaro_counts match_word_avx512(std::span<const std::uint32_t> reach,
                              std::span<const std::uint32_t> b, std::size_t window) noexcept;

}  // namespace zul::search::detail
