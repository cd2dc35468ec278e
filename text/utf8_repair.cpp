// UTF-8 repair in one forward pass: well_formed_prefix runs over the valid
// stretch (eight ASCII bytes per step, then one table look-up per lead byte)
// and the stretch is appended in one copy; only the byte where it stopped is
// replaced, and the scan resumes right after it. Tests compare it with a
// per-position reference (tests/reference/utf8_repair_reference.h).
#include "text/utf8_repair.h"

#include <algorithm>
#include <array>
#include <cstring>

#include "common/size_gate.h"
#include "common/utf8.h"

namespace zul::text {
namespace {

constexpr std::uint64_t kHighBits = 0x8080808080808080ull;

// Each byte is kept or replaced: the worst case, capped at the limit.
std::size_t reserve_size(std::size_t n, std::string_view placeholder, std::uint64_t limit) {
  return worst_case_reserve(n, std::max<std::size_t>(placeholder.size(), 1), 0, limit);
}

}  // namespace

std::size_t well_formed_prefix(bytes_view bytes) noexcept {
  const std::uint8_t* const p = bytes.data();
  const std::size_t n = bytes.size();
  std::size_t i = 0;
  while (i < n) {
    // Sixteen bytes at a time while none has its high bit set.
    while (i + 16 <= n) {
      std::uint64_t w0, w1;
      std::memcpy(&w0, p + i, 8);
      std::memcpy(&w1, p + i + 8, 8);
      if ((w0 | w1) & kHighBits) break;
      i += 16;
    }
    if (i >= n) break;
    const std::uint8_t c = p[i];
    if (c < 0x80) {
      ++i;
      continue;
    }
    const utf8_lead row = kUtf8Leads[c];
    if (row.length == 0 || n - i < row.length) return i;
    if (p[i + 1] < row.second_low || p[i + 1] > row.second_high) return i;
    if (row.length >= 3 && !is_utf8_continuation(p[i + 2])) return i;
    if (row.length == 4 && !is_utf8_continuation(p[i + 3])) return i;
    i += row.length;
  }
  return n;
}

std::string repair_utf8(bytes_view bytes, std::string_view placeholder, std::uint64_t limit) {
  std::string out;
  out.reserve(reserve_size(bytes.size(), placeholder, limit));
  std::size_t i = 0;
  while (i < bytes.size()) {
    const std::size_t run = well_formed_prefix(bytes.subspan(i));
    if (!make_room(out, run, limit)) return {};
    out.append(reinterpret_cast<const char*>(bytes.data() + i), run);
    i += run;
    if (i == bytes.size()) break;
    if (!make_room(out, placeholder.size(), limit)) return {};
    out.append(placeholder);
    ++i;
  }
  return out;
}

}  // namespace zul::text
