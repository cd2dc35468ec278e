// Counting and ordering of raw byte strings: how often one byte string occurs
// in another (leftmost match first, no overlaps) and a three-way byte order in
// which the shorter string reads as if padded with zero bytes. Exact: no
// case folding, no locale, nothing decoded.
#pragma once

#include <cstdint>
#include <span>

#include "common/bytes.h"

namespace zul::search {

// Number of non-overlapping occurrences of find in s, scanning left to right
// and resuming after each match ("aa" occurs twice in "aaaa", once in
// "aaa"). An empty find, an empty s or a find longer than s gives 0.
std::int64_t count_occurrences(bytes_view s, bytes_view find) noexcept;

// -1, 0 or 1 as a orders before, equal to or after b, comparing unsigned
// bytes over the longer length with the shorter string read as followed by
// zero bytes: a proper prefix sorts first unless the rest of the longer
// string is all zero bytes, in which case the two compare equal.
int compare_bytes(bytes_view a, bytes_view b) noexcept;

}  // namespace zul::search
