// First-of-set byte search over raw bytes: the set is the bytes of a second
// string, one to three inclusive ranges of byte values, or both. Results are
// 1-based positions, 0 when no byte matches. Nothing is decoded or folded:
// the bytes are compared as stored.
#pragma once

#include <cstdint>
#include <span>

#include "common/bytes.h"

namespace zul::search {

// An inclusive range of byte values; first > last contains nothing. Bounds
// are taken as given (no clamping to a byte, no swapping).
struct byte_range {
  std::int64_t first;
  std::int64_t last;
};

// Position of the first byte of target equal to any byte of set; 0 when
// there is none or set is empty.
std::int64_t find_first_of(bytes_view target, bytes_view set);

// Position of the first byte of target whose unsigned value (0..255) lies in
// one of the ranges.
std::int64_t find_in_ranges(bytes_view target, std::span<const byte_range> ranges);

// Position of the first byte of target whose signed value (-128..127) lies in
// one of the ranges, or that equals a byte of set.
std::int64_t find_in_signed_ranges_or_set(bytes_view target, std::span<const byte_range> ranges,
                                          bytes_view set);

}  // namespace zul::search
