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

namespace detail {

std::int64_t count_occurrences_scalar(bytes_view s, bytes_view find) noexcept {
  const std::size_t n = s.size();
  const std::size_t m = find.size();
  if (m == 0 || n == 0 || m > n) return 0;
  std::int64_t count = 0;
  std::size_t p = 0;
  while (p <= n - m) {
    std::size_t k = 0;
    while (k < m && s[p + k] == find[k]) ++k;
    if (k == m) {
      ++count;
      p += m;
    } else {
      ++p;
    }
  }
  return count;
}

int compare_bytes_scalar(bytes_view a, bytes_view b) noexcept {
  const std::size_t n = std::max(a.size(), b.size());
  for (std::size_t i = 0; i < n; ++i) {
    const unsigned x = i < a.size() ? a[i] : 0u;
    const unsigned y = i < b.size() ? b[i] : 0u;
    if (x != y) return x < y ? -1 : 1;
  }
  return 0;
}

}  // namespace detail

}  // namespace zul::search
