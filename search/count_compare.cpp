// Counting and byte ordering. The counting jumps from one candidate start to
// the next with memchr on the first byte of the pattern and checks the rest
// with memcmp: still one forward scan, but the C library's vectorised loops
// do the skipping. The ordering compares the common prefix with memcmp and
// then only asks whether the longer tail holds a non-zero byte.
#include "search/count_compare.h"

#include <algorithm>
#include <cstring>

namespace zul::search {

std::int64_t count_occurrences(bytes_view s, bytes_view find) noexcept {
  const std::size_t n = s.size();
  const std::size_t m = find.size();
  if (m == 0 || n == 0 || m > n) return 0;
  const std::uint8_t* p = s.data();
  if (m == 1) {
    return static_cast<std::int64_t>(std::count(s.begin(), s.end(), find[0]));
  }
  const std::uint8_t* const last = p + (n - m);  // last candidate start
  const std::uint8_t first = find[0];
  std::int64_t count = 0;
  while (p <= last) {
    const void* hit = std::memchr(p, first, static_cast<std::size_t>(last - p) + 1);
    if (!hit) break;
    p = static_cast<const std::uint8_t*>(hit);
    if (std::memcmp(p + 1, find.data() + 1, m - 1) == 0) {
      ++count;
      p += m;
    } else {
      ++p;
    }
  }
  return count;
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
