// Kernels of the TRUE / FALSE rewrite: the search for the next byte that can
// change the rewrite's state, that is a quote, or the first letter of "true"
// or "false" (either case) right after a separator. One table per level,
// chosen once per process.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "common/cpu.h"
#include "common/dispatch.h"

namespace zul::encodings::detail {

// Separators end words: bytes 0..32 and 128..255, "(", ")", "," and ";".
constexpr bool is_sql_separator(std::uint8_t b) {
  return b <= 32 || b >= 128 || b == '(' || b == ')' || b == ',' || b == ';';
}
constexpr bool is_sql_quote(std::uint8_t b) { return b == '\'' || b == '"'; }
constexpr bool is_boolean_initial(std::uint8_t b) { return (b | 0x20) == 't' || (b | 0x20) == 'f'; }

// Byte classes for the vector kernels, from two nibble look-ups (the method
// of shuffle-based character classes): class = kLow[b & 15] & kHigh[b >> 4],
// exact because every class bit stands for one rectangle of low and high
// nibbles:
//   bit 0  quote          hi 2, lo 2 or 7       (" ')
//   bit 1  t T            hi 5 or 7, lo 4
//   bit 2  f F            hi 4 or 6, lo 6
//   bit 3  separator      hi 0, 1, 8..15, any lo (0..31, 128..255)
//   bit 4  separator      hi 2, lo 0, 8, 9, 12   (space ( ) ,)
//   bit 5  separator      hi 3, lo 11            (;)
namespace sql_classes {
inline constexpr char kQuote = 0x01, kInitial = 0x06, kSeparator = 0x38;
inline constexpr char kLow[16] = {0x18, 0x08, 0x09, 0x08, 0x0A, 0x08, 0x0C, 0x09,
                                  0x18, 0x18, 0x08, 0x28, 0x18, 0x08, 0x08, 0x08};
inline constexpr char kHigh[16] = {0x08, 0x08, 0x11, 0x20, 0x04, 0x02, 0x04, 0x02,
                                   0x08, 0x08, 0x08, 0x08, 0x08, 0x08, 0x08, 0x08};
}  // namespace sql_classes

struct sql_kernels {
  // Index of the first byte of [p, p + n) that is a quote, or a boolean
  // initial whose previous byte is a separator; n when none is. Reads
  // p[-1], which must exist.
  std::size_t (*find_boolean_candidate)(const std::uint8_t* p, std::size_t n) noexcept;
};

const simd::family_tables<sql_kernels>& sql_tables() noexcept;

// The machine's kernels, and those of one level (for tests and benchmarks).
const sql_kernels& machine_sql_kernels() noexcept;
inline const sql_kernels& sql_kernels_for(simd::isa level) noexcept {
  return simd::kernels_for(sql_tables(), level);
}

// Block kernel of MySQL unescaping: decodes whole blocks of in[0, n) into
// out (room for n bytes), never stopping between a backslash and the byte
// it escapes. Returns the bytes consumed; *written is the bytes written.
// Null where the level has none (the memchr loop of sql.cpp does all).
// The byte each MySQL escape letter stands for; 0xFFFF: no escape.
inline constexpr std::array<std::uint16_t, 256> kMySQLEscapes = [] {
  std::array<std::uint16_t, 256> table{};
  for (auto& entry : table) entry = 0xFFFF;
  table['0'] = 0;
  table['\''] = '\'';
  table['"'] = '"';
  table['b'] = 8;
  table['n'] = '\n';
  table['r'] = '\r';
  table['t'] = '\t';
  table['Z'] = 26;
  table['\\'] = '\\';
  table['%'] = '%';
  table['_'] = '_';
  return table;
}();

struct mysql_kernels {
  std::size_t (*unescape)(const std::uint8_t* in, std::size_t n, std::uint8_t* out,
                          std::size_t* written) noexcept;
};
const simd::family_tables<mysql_kernels>& mysql_tables() noexcept;
std::size_t unescape_mysql_avx512_vbmi2(const std::uint8_t* in, std::size_t n, std::uint8_t* out,
                                        std::size_t* written) noexcept;

std::size_t find_boolean_candidate_scalar(const std::uint8_t* p, std::size_t n) noexcept;
std::size_t find_boolean_candidate_avx2(const std::uint8_t* p, std::size_t n) noexcept;
std::size_t find_boolean_candidate_avx512(const std::uint8_t* p, std::size_t n) noexcept;
std::size_t find_boolean_candidate_neon(const std::uint8_t* p, std::size_t n) noexcept;

}  // namespace zul::encodings::detail
