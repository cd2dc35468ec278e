// Vector prefix skip for the byte search: tests 32 bytes at a time against a
// few ranges and set bytes and returns how many leading bytes surely do not
// match, so the table-driven scan only looks at the rest.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace zul::search::detail {

// A byte matches when (byte - low[i]) mod 256 <= span[i] for some range, or
// equals one of set[0..set_size). Modular ranges express both unsigned and
// signed byte ranges (a signed range across zero wraps around 0x00).
struct vector_matcher {
  static constexpr int kMaxRanges = 3;
  static constexpr int kMaxSetBytes = 8;
  std::uint8_t low[kMaxRanges] = {};
  std::uint8_t span[kMaxRanges] = {};
  int ranges = 0;
  std::uint8_t set[kMaxSetBytes] = {};
  int set_size = 0;
};

// Number of leading bytes of target (a multiple of 32) in which no byte
// matches; stops before the first 32-byte block holding a match.
std::size_t skip_unmatched_prefix(std::span<const std::uint8_t> target, const vector_matcher& m);

}  // namespace zul::search::detail
