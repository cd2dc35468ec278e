// ISO 8859-1 / Windows-1252 conversion cores. Decoding is one table lookup
// per byte into a handle sized once. Encoding uses a reverse map derived at
// compile time from the same table (lowest byte first, as a search from
// index 0 would find), plus a word-at-a-time copy of ASCII runs, which both
// tables map to themselves. Tests compare it with a plain table search
// (tests/reference/latin1_reference.h).
#include "text/latin1.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <stdexcept>

namespace zul::text {
namespace {

constexpr single_byte_charset derive_charset(const charset_table& table) {
  single_byte_charset set{&table, {}, {}, 0, true};
  set.low.fill(-1);
  for (int k = 255; k >= 0; --k) {  // downwards, so the lowest byte is left
    if (table[k] < 0x100) set.low[table[k]] = static_cast<std::int16_t>(k);
  }
  for (int k = 0; k < 256; ++k) {
    const std::uint32_t unit = table[k];
    if (unit < 0x100) continue;
    bool seen = false;
    for (std::size_t i = 0; i < set.high_count; ++i) seen = seen || (set.high[i] >> 8) == unit;
    if (seen) continue;
    // Not a constant expression, so a table too wide fails to compile.
    if (set.high_count == set.high.size()) throw std::length_error("too many wide code points");
    set.high[set.high_count++] = (unit << 8) | static_cast<std::uint32_t>(k);
  }
  std::sort(set.high.begin(), set.high.begin() + static_cast<std::ptrdiff_t>(set.high_count));
  for (int k = 0; k < 0x80; ++k) set.ascii_identity = set.ascii_identity && set.low[k] == k;
  return set;
}

// Four UTF-16 units per 64-bit word: all below 0x80 when no lane has a bit
// of 0xFF80 set. The mask is the same in either byte order.
constexpr std::uint64_t kNonASCIILanes = 0xFF80FF80FF80FF80u;

// Copies the longest prefix of units[from..] made of whole words of ASCII
// units to out; returns the index of the first unit not copied.
std::size_t copy_ascii_words(std::span<const std::uint16_t> units, std::size_t from,
                             std::uint8_t* out) noexcept {
  std::size_t i = from;
  while (i + 4 <= units.size()) {
    std::uint64_t word;
    std::memcpy(&word, units.data() + i, sizeof word);
    if (word & kNonASCIILanes) break;
    out[0] = static_cast<std::uint8_t>(units[i]);
    out[1] = static_cast<std::uint8_t>(units[i + 1]);
    out[2] = static_cast<std::uint8_t>(units[i + 2]);
    out[3] = static_cast<std::uint8_t>(units[i + 3]);
    out += 4;
    i += 4;
  }
  return i;
}

// Shrinks out to count bytes (never fails: it stays within the block) or
// gives it up when nothing was written.
owned_handle finish(owned_handle out, std::size_t count) noexcept {
  if (count == 0) return {};
  set_handle_size(out.get(), count);
  return out;
}

}  // namespace

constinit const single_byte_charset kISO8859_1 = derive_charset(escapecharsISO8859);
constinit const single_byte_charset kWindows1252 = derive_charset(escapecharsCP1252);

int byte_for_unit(const single_byte_charset& set, std::uint16_t unit) noexcept {
  if (unit < 0x100) return set.low[unit];
  const auto* first = set.high.data();
  const auto* last = first + set.high_count;
  const std::uint32_t key = static_cast<std::uint32_t>(unit) << 8;
  const auto* it = std::lower_bound(first, last, key);
  return (it != last && (*it >> 8) == unit) ? static_cast<int>(*it & 0xFF) : -1;
}

owned_handle decode_single_byte(std::span<const std::uint8_t> bytes, const single_byte_charset& set,
                                std::size_t limit) noexcept {
  if (bytes.empty() || bytes.size() > std::numeric_limits<std::size_t>::max() / 2) return {};
  owned_handle out(new_handle(2 * bytes.size(), limit));
  if (!out) return {};
  handle_lock lock(out.get());
  auto* units = reinterpret_cast<std::uint16_t*>(lock.data());
  const charset_table& table = *set.to_unicode;
  for (std::size_t i = 0; i < bytes.size(); ++i) units[i] = table[bytes[i]];
  return out;
}

owned_handle encode_single_byte(std::span<const std::uint16_t> units,
                                const single_byte_charset& set, std::size_t limit) noexcept {
  if (units.empty()) return {};
  // At most one byte per unit, so the handle never has to grow.
  owned_handle out(new_handle(units.size(), limit));
  if (!out) return {};
  std::size_t count = 0;
  {
    handle_lock lock(out.get());
    std::uint8_t* bytes = lock.data();
    std::size_t i = 0;
    while (i < units.size()) {
      if (set.ascii_identity) {
        const std::size_t next = copy_ascii_words(units, i, bytes + count);
        count += next - i;
        i = next;
        if (i == units.size()) break;
      }
      const int b = byte_for_unit(set, units[i++]);
      if (b >= 0) bytes[count++] = static_cast<std::uint8_t>(b);
    }
  }
  return finish(std::move(out), count);
}

}  // namespace zul::text
