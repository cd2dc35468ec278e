// Readable units are classified by one 256-entry table on their first byte:
// single-byte units, lead bytes with the allowed range of their second byte
// (Unicode Table 3-7, well-formed UTF-8 byte sequences), and bytes that end a
// run. Later bytes of a multi-byte unit are always 0x80..0xBF.
#include "binary/readable_runs.h"

#include <array>

namespace zul::binary::detail {
namespace {

struct unit_class {
  std::uint8_t length;  // 0: ends a run; 1: one-byte unit; 2..4: lead byte
  std::uint8_t low;     // allowed range of the second byte of a lead byte
  std::uint8_t high;
};

constexpr std::array<unit_class, 256> kUnits = [] {
  std::array<unit_class, 256> t{};
  t[0x09] = t[0x0A] = t[0x0D] = {1, 0, 0};
  for (int b = 0x20; b <= 0x7E; ++b) t[b] = {1, 0, 0};
  for (int b = 0xC2; b <= 0xDF; ++b) t[b] = {2, 0x80, 0xBF};
  t[0xE0] = {3, 0xA0, 0xBF};
  for (int b = 0xE1; b <= 0xEF; ++b) t[b] = {3, 0x80, 0xBF};
  t[0xED] = {3, 0x80, 0x9F};
  t[0xF0] = {4, 0x90, 0xBF};
  for (int b = 0xF1; b <= 0xF3; ++b) t[b] = {4, 0x80, 0xBF};
  t[0xF4] = {4, 0x80, 0x8F};
  return t;
}();

bool is_continuation(std::uint8_t b) { return (b & 0xC0) == 0x80; }

}  // namespace

run_measure measure_run(std::span<const std::uint8_t> data, std::size_t pos) {
  const std::uint8_t* d = data.data();
  const std::size_t n = data.size();
  std::size_t i = pos;
  bool visible = false;
  while (i < n) {
    const std::uint8_t b = d[i];
    const unit_class unit = kUnits[b];
    if (unit.length == 1) {
      visible |= b > 0x20;
      ++i;
      continue;
    }
    if (unit.length == 0 || unit.length > n - i) break;
    const std::uint8_t second = d[i + 1];
    if (second < unit.low || second > unit.high) break;
    if (unit.length >= 3 && !is_continuation(d[i + 2])) break;
    if (unit.length == 4 && !is_continuation(d[i + 3])) break;
    visible = true;
    i += unit.length;
  }
  return {i - pos, visible};
}

}  // namespace zul::binary::detail
