// Position-by-position counting and byte ordering: the references for the
// memchr / memcmp based versions in search/count_compare.h.
#pragma once

#include <cstdint>

#include "common/bytes.h"

namespace zul::reference {

// Non-overlapping occurrences of find in s, scanning from the left; 0 for
// an empty find.
std::int64_t count_occurrences_reference(bytes_view s, bytes_view find);

// -1, 0 or 1, ordering a and b byte by byte over the longer length with the
// shorter read as followed by zero bytes.
int compare_bytes_reference(bytes_view a, bytes_view b);

}  // namespace zul::reference
