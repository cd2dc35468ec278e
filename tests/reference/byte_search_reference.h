// Byte-at-a-time first-of-set searches: the references that tests, fuzz
// targets and benchmarks compare the shipped table and vector searches with.
// For each target byte the ranges and then the set bytes are tested in order.
// Results are 1-based positions, 0 when no byte matches.
#pragma once

#include <cstdint>
#include <span>

#include "common/bytes.h"
#include "search/byte_search.h"

namespace zul::reference {

std::int64_t find_first_of_reference(bytes_view target, bytes_view set);
std::int64_t find_in_ranges_reference(bytes_view target,
                                      std::span<const search::byte_range> ranges);
std::int64_t find_in_signed_ranges_or_set_reference(bytes_view target,
                                                    std::span<const search::byte_range> ranges,
                                                    bytes_view set);

}  // namespace zul::reference
