// Byte search. The fast versions turn the set into a 256-entry membership
// table (on the stack, no allocation) so that the scan costs one load per
// target byte whatever the size of the set; a set of one byte goes to
// memchr, and small sets (up to three ranges and eight bytes) first skip
// unmatched 32-byte blocks with vector compares. Tests compare them with
// byte-at-a-time references (tests/reference/byte_search_reference.h).
#include "search/byte_search.h"

#include <array>
#include <cstring>

#include "search/byte_search_simd.h"

namespace zul::search {
namespace {

using table = std::array<bool, 256>;

bool in_range(std::int64_t value, const byte_range& r) {
  return r.first <= value && value <= r.last;
}

std::int64_t scan(bytes_view target, const table& members, std::size_t from = 0) {
  for (std::size_t i = from; i < target.size(); ++i) {
    if (members[target[i]]) return static_cast<std::int64_t>(i) + 1;
  }
  return 0;
}

// Adds an inclusive range of byte values, given as they are read (0..255
// unsigned or -128..127 signed), to the vector matcher as a modular range.
// Returns false when the matcher has no room left.
bool add_range(detail::vector_matcher& m, const byte_range& r, std::int64_t min, std::int64_t max) {
  const std::int64_t low = r.first > min ? r.first : min;
  const std::int64_t high = r.last < max ? r.last : max;
  if (low > high) return true;  // nothing of it is a byte value
  if (m.ranges == detail::vector_matcher::kMaxRanges) return false;
  m.low[m.ranges] = static_cast<std::uint8_t>(low);
  m.span[m.ranges] = static_cast<std::uint8_t>(high - low);
  ++m.ranges;
  return true;
}

bool add_bytes(detail::vector_matcher& m, bytes_view set) {
  if (set.size() > detail::vector_matcher::kMaxSetBytes) return false;
  for (std::uint8_t b : set) m.set[m.set_size++] = b;
  return true;
}

std::size_t vector_skip(bytes_view target, const detail::vector_matcher& m) {
  return target.size() >= 32 ? detail::skip_unmatched_prefix(target, m) : 0;
}

void add_set(table& members, bytes_view set) {
  for (std::uint8_t b : set) members[b] = true;
}

}  // namespace

std::int64_t find_first_of(bytes_view target, bytes_view set) {
  if (target.empty() || set.empty()) return 0;
  if (set.size() == 1) {
    const void* hit = std::memchr(target.data(), set[0], target.size());
    return hit ? static_cast<const std::uint8_t*>(hit) - target.data() + 1 : 0;
  }
  table members{};
  add_set(members, set);
  detail::vector_matcher m;
  const std::size_t skipped = add_bytes(m, set) ? vector_skip(target, m) : 0;
  return scan(target, members, skipped);
}

std::int64_t find_in_ranges(bytes_view target, std::span<const byte_range> ranges) {
  if (target.empty()) return 0;
  table members{};
  for (int b = 0; b < 256; ++b) {
    for (const byte_range& r : ranges) members[b] = members[b] || in_range(b, r);
  }
  detail::vector_matcher m;
  bool fits = true;
  for (const byte_range& r : ranges) fits = fits && add_range(m, r, 0, 255);
  return scan(target, members, fits ? vector_skip(target, m) : 0);
}

std::int64_t find_in_signed_ranges_or_set(bytes_view target, std::span<const byte_range> ranges,
                                          bytes_view set) {
  if (target.empty()) return 0;
  table members{};
  for (int b = 0; b < 256; ++b) {
    const std::int64_t value = static_cast<std::int8_t>(b);
    for (const byte_range& r : ranges) members[b] = members[b] || in_range(value, r);
  }
  add_set(members, set);
  detail::vector_matcher m;
  bool fits = add_bytes(m, set);
  for (const byte_range& r : ranges) fits = fits && add_range(m, r, -128, 127);
  return scan(target, members, fits ? vector_skip(target, m) : 0);
}

}  // namespace zul::search
