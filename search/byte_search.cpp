// Byte search. The fast versions first turn the set into a 256-entry
// membership table (on the stack, no allocation) so that the scan costs one
// load per target byte whatever the size of the set; a set of one byte goes
// to memchr. The scalar versions follow the plain definition and serve as
// the reference in tests.
#include "search/byte_search.h"

#include <array>
#include <cstring>

namespace zul::search {
namespace {

using table = std::array<bool, 256>;

bool in_range(std::int64_t value, const byte_range& r) { return r.first <= value && value <= r.last; }

std::int64_t scan(bytes_view target, const table& members) {
  for (std::size_t i = 0; i < target.size(); ++i) {
    if (members[target[i]]) return static_cast<std::int64_t>(i) + 1;
  }
  return 0;
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
  return scan(target, members);
}

std::int64_t find_in_ranges(bytes_view target, std::span<const byte_range> ranges) {
  if (target.empty()) return 0;
  table members{};
  for (int b = 0; b < 256; ++b) {
    for (const byte_range& r : ranges) members[b] = members[b] || in_range(b, r);
  }
  return scan(target, members);
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
  return scan(target, members);
}

namespace detail {

std::int64_t find_first_of_scalar(bytes_view target, bytes_view set) {
  for (std::size_t i = 0; i < target.size(); ++i) {
    for (std::uint8_t b : set) {
      if (target[i] == b) return static_cast<std::int64_t>(i) + 1;
    }
  }
  return 0;
}

std::int64_t find_in_ranges_scalar(bytes_view target, std::span<const byte_range> ranges) {
  for (std::size_t i = 0; i < target.size(); ++i) {
    for (const byte_range& r : ranges) {
      if (in_range(target[i], r)) return static_cast<std::int64_t>(i) + 1;
    }
  }
  return 0;
}

std::int64_t find_in_signed_ranges_or_set_scalar(bytes_view target,
                                                 std::span<const byte_range> ranges,
                                                 bytes_view set) {
  for (std::size_t i = 0; i < target.size(); ++i) {
    const std::int64_t value = static_cast<std::int8_t>(target[i]);
    for (const byte_range& r : ranges) {
      if (in_range(value, r)) return static_cast<std::int64_t>(i) + 1;
    }
    for (std::uint8_t b : set) {
      if (target[i] == b) return static_cast<std::int64_t>(i) + 1;
    }
  }
  return 0;
}

}  // namespace detail
}  // namespace zul::search
