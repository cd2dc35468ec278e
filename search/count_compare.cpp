// Counting and byte ordering. The counting runs the machine's counting
// kernels (search/count_kernels.h): 8-bit lane counters for one byte, a
// first- and last-byte filter then a full check for longer patterns. The
// ordering compares the common prefix with memcmp and then only asks
// whether the longer tail holds a non-zero byte.
#include "search/count_compare.h"

#include <algorithm>
#include <cstring>

#include "search/count_kernels.h"

namespace zul::search {

std::int64_t count_occurrences(bytes_view s, bytes_view find) noexcept {
  if (find.empty() || s.empty() || find.size() > s.size()) return 0;
  const detail::count_kernels& k = detail::active_count_kernels();
  const std::uint64_t count = find.size() == 1
                                  ? k.count_byte(s.data(), s.size(), find[0])
                                  : k.count_pattern(s.data(), s.size(), find.data(), find.size());
  return static_cast<std::int64_t>(count);
}

int compare_bytes(bytes_view a, bytes_view b) noexcept {
  const std::size_t common = std::min(a.size(), b.size());
  if (common > 0) {
    const int r = std::memcmp(a.data(), b.data(), common);
    if (r != 0) return r < 0 ? -1 : 1;
  }
  // Past the common part the shorter string reads as zero bytes, so the
  // longer one is greater exactly when its tail holds a non-zero byte.
  const bytes_view tail = a.size() > b.size() ? a.subspan(common) : b.subspan(common);
  const bool nonzero = std::any_of(tail.begin(), tail.end(), [](std::uint8_t c) { return c != 0; });
  if (!nonzero) return 0;
  return a.size() > b.size() ? 1 : -1;
}

}  // namespace zul::search
