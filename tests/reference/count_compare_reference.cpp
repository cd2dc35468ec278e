// One position at a time, written for clarity, not speed.
#include "tests/reference/count_compare_reference.h"

#include <algorithm>

namespace zul::reference {

std::int64_t count_occurrences_reference(bytes_view s, bytes_view find) {
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

int compare_bytes_reference(bytes_view a, bytes_view b) {
  const std::size_t n = std::max(a.size(), b.size());
  for (std::size_t i = 0; i < n; ++i) {
    const unsigned x = i < a.size() ? a[i] : 0u;
    const unsigned y = i < b.size() ? b[i] : 0u;
    if (x != y) return x < y ? -1 : 1;
  }
  return 0;
}

}  // namespace zul::reference
