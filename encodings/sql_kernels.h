// Kernels of the TRUE / FALSE rewrite: the search for the next byte that can
// change the rewrite's state, that is a quote, or the first letter of "true"
// or "false" (either case) right after a separator. One table per level,
// chosen once per process.
#pragma once

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

std::size_t find_boolean_candidate_scalar(const std::uint8_t* p, std::size_t n) noexcept;
std::size_t find_boolean_candidate_avx2(const std::uint8_t* p, std::size_t n) noexcept;
std::size_t find_boolean_candidate_avx512(const std::uint8_t* p, std::size_t n) noexcept;

}  // namespace zul::encodings::detail
