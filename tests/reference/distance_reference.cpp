// Quadratic Jaro-Winkler and three-row edit distance: see the header.
#include "tests/reference/distance_reference.h"

#include <algorithm>
#include <limits>
#include <vector>

namespace zul::reference {
namespace {

using code_points = std::span<const std::uint32_t>;

// The recurrence reads only the two rows before the current one, and the
// distance is symmetric, so the shorter text spans a row.
template <class Cell>
std::int64_t edit_distance_rows(code_points shorter, code_points longer) {
  const std::size_t n = shorter.size();
  const std::size_t m = longer.size();
  std::vector<Cell> buffer(3 * (n + 1));
  Cell* before = buffer.data();      // row i - 2
  Cell* previous = before + n + 1;   // row i - 1
  Cell* current = previous + n + 1;  // row i
  for (std::size_t j = 0; j <= n; ++j) previous[j] = static_cast<Cell>(j);
  for (std::size_t i = 1; i <= m; ++i) {
    const std::uint32_t c = longer[i - 1];
    const std::uint32_t c_before = i >= 2 ? longer[i - 2] : 0;
    current[0] = static_cast<Cell>(i);
    for (std::size_t j = 1; j <= n; ++j) {
      const Cell cost = shorter[j - 1] != c ? 1 : 0;
      Cell v = std::min<Cell>(previous[j] + 1, current[j - 1] + 1);
      v = std::min<Cell>(v, previous[j - 1] + cost);
      if (i >= 2 && j >= 2 && c == shorter[j - 2] && c_before == shorter[j - 1]) {
        v = std::min<Cell>(v, before[j - 2] + cost);
      }
      current[j] = v;
    }
    Cell* recycled = before;
    before = previous;
    previous = current;
    current = recycled;
  }
  return static_cast<std::int64_t>(previous[n]);
}

}  // namespace

std::int64_t edit_distance_reference(code_points a, code_points b) {
  const code_points shorter = a.size() <= b.size() ? a : b;
  const code_points longer = a.size() <= b.size() ? b : a;
  if (longer.size() < std::numeric_limits<std::uint32_t>::max()) {
    return edit_distance_rows<std::uint32_t>(shorter, longer);
  }
  return edit_distance_rows<std::uint64_t>(shorter, longer);
}

double jaro_winkler_distance_reference(code_points a, code_points b) {
  const std::size_t la = a.size();
  const std::size_t lb = b.size();
  if (la == 0) return lb == 0 ? 0.0 : 1.0;
  if (lb == 0) return 1.0;

  const std::size_t longest = std::max(la, lb);
  const std::size_t window = longest / 2 >= 1 ? longest / 2 - 1 : 0;
  std::vector<std::uint8_t> flags_a(la), flags_b(lb);

  std::size_t matches = 0;
  for (std::size_t i = 0; i < la; ++i) {
    const std::size_t from = i > window ? i - window : 0;
    const std::size_t to = std::min(i + window + 1, lb);
    for (std::size_t j = from; j < to; ++j) {
      if (!flags_b[j] && b[j] == a[i]) {
        flags_a[i] = flags_b[j] = 1;
        ++matches;
        break;
      }
    }
  }
  if (matches == 0) return 1.0;

  // Pair the matched characters of a and b in order; count the pairs that differ.
  std::size_t crossed = 0;
  std::size_t k = 0;
  for (std::size_t i = 0; i < la; ++i) {
    if (!flags_a[i]) continue;
    while (!flags_b[k]) ++k;
    if (a[i] != b[k]) ++crossed;
    ++k;
  }
  const auto m = static_cast<double>(matches);
  const auto t = static_cast<double>(crossed / 2);
  double s = ((m - t) / m + (m / static_cast<double>(lb) + m / static_cast<double>(la))) / 3.0;

  if (s > 0.7) {
    const std::size_t limit = std::min<std::size_t>({4, la, lb});
    std::size_t prefix = 0;
    while (prefix < limit && a[prefix] == b[prefix]) ++prefix;
    if (prefix >= 1) s = s + (1.0 - s) * (static_cast<double>(prefix) * 0.1);
  }
  return 1.0 - s;
}

}  // namespace zul::reference
