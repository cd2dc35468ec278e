// One byte at a time, written for clarity, not speed.
#include "tests/reference/byte_search_reference.h"

namespace zul::reference {
namespace {

bool in_range(std::int64_t value, const search::byte_range& r) {
  return r.first <= value && value <= r.last;
}

bool in_set(std::uint8_t b, bytes_view set) {
  for (std::uint8_t s : set) {
    if (b == s) return true;
  }
  return false;
}

}  // namespace

std::int64_t find_first_of_reference(bytes_view target, bytes_view set) {
  for (std::size_t i = 0; i < target.size(); ++i) {
    if (in_set(target[i], set)) return static_cast<std::int64_t>(i) + 1;
  }
  return 0;
}

std::int64_t find_in_ranges_reference(bytes_view target,
                                      std::span<const search::byte_range> ranges) {
  for (std::size_t i = 0; i < target.size(); ++i) {
    for (const search::byte_range& r : ranges) {
      if (in_range(target[i], r)) return static_cast<std::int64_t>(i) + 1;
    }
  }
  return 0;
}

std::int64_t find_in_signed_ranges_or_set_reference(bytes_view target,
                                                    std::span<const search::byte_range> ranges,
                                                    bytes_view set) {
  for (std::size_t i = 0; i < target.size(); ++i) {
    const std::int64_t value = static_cast<std::int8_t>(target[i]);
    for (const search::byte_range& r : ranges) {
      if (in_range(value, r)) return static_cast<std::int64_t>(i) + 1;
    }
    if (in_set(target[i], set)) return static_cast<std::int64_t>(i) + 1;
  }
  return 0;
}

}  // namespace zul::reference
