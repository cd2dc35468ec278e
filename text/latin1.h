// Conversion between text and the single-byte character sets ISO 8859-1 and
// Windows-1252. Each set is a table of 256 code points indexed by byte
// (Windows-1252 leaves 81, 8D, 8F, 90 and 9D undefined: they hold 0).
// Decoding maps every byte to exactly one UTF-16 unit; encoding maps each
// UTF-16 unit to the lowest byte whose table entry equals it and drops units
// that no entry holds (surrogate halves included). Output goes to handles.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>

#include "text/handles.h"
#include "text/latin1_kernels.h"

namespace zul::text {

using charset_table = std::array<std::uint16_t, 256>;

namespace detail {
// Windows-1252 code points of the bytes 80 to 9F (0 where undefined).
inline constexpr std::uint16_t kCP1252High[32] = {
    0x20AC, 0,      0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021,  // 80-87
    0x02C6, 0x2030, 0x0160, 0x2039, 0x0152, 0,      0x017D, 0,       // 88-8F
    0,      0x2018, 0x2019, 0x201C, 0x201D, 0x2022, 0x2013, 0x2014,  // 90-97
    0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0,      0x017E, 0x0178,  // 98-9F
};
constexpr charset_table make_cp1252() {
  charset_table t{};
  for (int k = 0; k < 256; ++k) t[k] = static_cast<std::uint16_t>(k);
  for (int k = 0; k < 32; ++k) t[0x80 + k] = kCP1252High[k];
  return t;
}
constexpr charset_table make_iso8859() {
  charset_table t{};
  for (int k = 0; k < 256; ++k) t[k] = static_cast<std::uint16_t>(k);
  return t;
}
}  // namespace detail

// ISO 8859-1: every entry equals its index.
inline constexpr charset_table escapecharsISO8859 = detail::make_iso8859();
// Windows-1252: ISO 8859-1 except for the bytes 80 to 9F.
inline constexpr charset_table escapecharsCP1252 = detail::make_cp1252();

// A character set with its reverse map, derived once at compile time from
// its table so that encoding costs two look-ups per unit instead of a
// search: the unit's high byte picks a row of bytes, its low byte the entry.
struct single_byte_charset {
  static constexpr std::size_t kRows = 8;  // no unit, units 00xx, and six more high bytes
  const charset_table* to_unicode;
  std::array<std::uint8_t, 256> row_of;                   // high byte -> row (0: none held)
  std::array<std::array<std::int16_t, 256>, kRows> rows;  // low byte -> byte, -1: none
  bool ascii_identity;                                    // units below 0x80 encode to themselves
  // The units from 0x100 up that the set holds, by a perfect hash for the
  // vector kernels: slot ((unit * hash_multiplier) & 0xFFFF) >> 10 holds
  // the unit (0 when the slot is free) and its byte. hash_multiplier is 0
  // when the set holds no such unit.
  std::uint16_t hash_multiplier;
  std::array<std::uint16_t, 64> hash_units;
  std::array<std::uint16_t, 64> hash_bytes;
  // The byte for a unit below 0x100, or -1.
  constexpr int low(std::uint16_t unit) const { return rows[1][unit & 0xFF]; }
};

// The two character sets, with their reverse maps.
extern const single_byte_charset kISO8859_1;
extern const single_byte_charset kWindows1252;

// Decodes bytes into native-order UTF-16 units, one per byte (block kernels
// of the given level, the scalar loop for the tail), in a handle
// of exactly 2 * bytes.size() bytes. Returns a null handle for empty input
// or when a handle of that size (at most limit bytes) cannot be had.
owned_handle decode_single_byte(std::span<const std::uint8_t> bytes, const single_byte_charset& set,
                                std::size_t limit = kHandleLimit,
                                const single_byte_kernels& kernels = single_byte_active()) noexcept;

// Encodes UTF-16 units, one byte per unit that the set holds, in a handle
// sized to the bytes written. Returns a null handle when nothing is written
// (empty input or no unit in the set) or when the handle (at most limit
// bytes, one per input unit) cannot be had.
owned_handle encode_single_byte(std::span<const std::uint16_t> units,
                                const single_byte_charset& set, std::size_t limit = kHandleLimit,
                                const single_byte_kernels& kernels = single_byte_active()) noexcept;

// The byte that encodes unit, or -1 when the set does not hold it.
inline int byte_for_unit(const single_byte_charset& set, std::uint16_t unit) noexcept {
  return set.rows[set.row_of[unit >> 8]][unit & 0xFF];
}

}  // namespace zul::text
