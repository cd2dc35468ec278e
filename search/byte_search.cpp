// Byte search. The fast versions turn the set and the ranges into one
// prepared byte set (two 16-byte nibble tables, on the stack) and run the
// machine's byte-set kernel, whose work per block does not depend on the
// size of the set; a set of one byte goes to memchr. Tests compare them
// with byte-at-a-time references (tests/reference/byte_search_reference.h).
#include "search/byte_search.h"

#include <cstring>

#include "common/byte_set.h"

namespace zul::search {
namespace {

// Adds the part of an inclusive range of byte values, read as min..max
// (0..255 unsigned or -128..127 signed), that holds byte values.
void add_range(simd::byte_set& set, const byte_range& r, std::int64_t min, std::int64_t max) {
  const std::int64_t low = r.first > min ? r.first : min;
  const std::int64_t high = r.last < max ? r.last : max;
  for (std::int64_t v = low; v <= high; ++v) set.add(static_cast<std::uint8_t>(v));
}

std::int64_t position(bytes_view target, const simd::byte_set& set) {
  const std::size_t i = simd::find_first_in_set(set, target);
  return i == target.size() ? 0 : static_cast<std::int64_t>(i) + 1;
}

}  // namespace

std::int64_t find_first_of(bytes_view target, bytes_view set) {
  if (target.empty() || set.empty()) return 0;
  if (set.size() == 1) {
    const void* hit = std::memchr(target.data(), set[0], target.size());
    return hit ? static_cast<const std::uint8_t*>(hit) - target.data() + 1 : 0;
  }
  return position(target, simd::make_byte_set(set));
}

std::int64_t find_in_ranges(bytes_view target, std::span<const byte_range> ranges) {
  if (target.empty()) return 0;
  simd::byte_set members;
  for (const byte_range& r : ranges) add_range(members, r, 0, 255);
  return position(target, members);
}

std::int64_t find_in_signed_ranges_or_set(bytes_view target, std::span<const byte_range> ranges,
                                          bytes_view set) {
  if (target.empty()) return 0;
  simd::byte_set members = simd::make_byte_set(set);
  for (const byte_range& r : ranges) add_range(members, r, -128, 127);
  return position(target, members);
}

}  // namespace zul::search
