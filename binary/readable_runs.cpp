// Readable units are classified by one 256-entry table on their first byte:
// single-byte units, lead bytes with the allowed range of their second byte
// (Unicode Table 3-7, well-formed UTF-8 byte sequences), and bytes that end a
// run. Later bytes of a multi-byte unit are always 0x80..0xBF. A run that
// goes on past its first bytes is measured by byte-set searches over its
// ASCII stretches.
#include "binary/readable_runs.h"

#include <array>

#include "common/utf8.h"

namespace zul::binary::detail {
namespace {

// The UTF-8 lead table with the ASCII rows changed: only tab, line feed,
// carriage return and 0x20..0x7E are one-byte units; every other ASCII byte
// (length 0) ends a run.
constexpr std::array<utf8_lead, 256> kUnits = [] {
  std::array<utf8_lead, 256> t = kUtf8Leads;
  for (int b = 0x00; b <= 0x7F; ++b) t[b].length = 0;
  t[0x09].length = t[0x0A].length = t[0x0D].length = 1;
  for (int b = 0x20; b <= 0x7E; ++b) t[b].length = 1;
  return t;
}();

// Bytes that are not a one-byte unit: they end an ASCII stretch.
constexpr simd::byte_set kEndsAscii =
    byte_set_where([](std::uint8_t b) { return kUnits[b].length != 1; });

// Bytes judged one by one before a byte-set search is worth its cost
// (binary data mostly has short runs).
constexpr std::size_t kScalarFirst = 32;

}  // namespace

run_measure measure_run(std::span<const std::uint8_t> data, std::size_t pos,
                        const scan_kernels& scan) {
  const std::uint8_t* d = data.data();
  const std::size_t n = data.size();
  std::size_t i = pos;
  bool visible = false;
  std::size_t search_from = pos + kScalarFirst;
  while (i < n) {
    if (i >= search_from) {
      // A long run: the ASCII stretch ahead in one search.
      const std::size_t stretch = scan.find_first(kEndsAscii, d + i, n - i);
      for (std::size_t k = i; !visible && k < i + stretch; ++k) visible = d[k] > 0x20;
      i += stretch;
      search_from = i + kScalarFirst;
      if (i == n) break;
    }
    const std::uint8_t b = d[i];
    const utf8_lead unit = kUnits[b];
    if (unit.length == 1) {
      visible |= b > 0x20;
      ++i;
      continue;
    }
    if (unit.length == 0 || unit.length > n - i) break;
    const std::uint8_t second = d[i + 1];
    if (second < unit.second_low || second > unit.second_high) break;
    if (unit.length >= 3 && !is_utf8_continuation(d[i + 2])) break;
    if (unit.length == 4 && !is_utf8_continuation(d[i + 3])) break;
    visible = true;
    i += unit.length;
  }
  return {i - pos, visible};
}

}  // namespace zul::binary::detail
