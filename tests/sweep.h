// Inputs for comparing a worker's vector paths with its reference: plain
// filler of every length up to a few vector widths with one special byte at
// every position, and the same length made only of that byte, so that each
// kernel meets the byte in every lane, at block edges and in the tail. Also
// a UTF-8 model that decodes the code point, for the table-driven checkers;
// and the loop over every kernel level the machine runs.
#pragma once

#include <gtest/gtest.h>

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>

#include "common/dispatch.h"

namespace zul::testing_sweep {

// Calls body(kernels) with each level's kernels the machine runs, the
// level named in any failure.
template <class Table, class Body>
void for_each_kernel(const simd::family_tables<Table>& tables, Body body) {
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    body(simd::kernels_for(tables, level));
  }
}

// Calls check(input) for each input.
template <class Check>
void special_byte_sweep(std::string_view specials, std::size_t max_length, Check check) {
  static constexpr std::string_view kFiller = "Plain text, made of words 0123456789 and more";
  for (std::size_t length = 0; length <= max_length; ++length) {
    std::string base(length, ' ');
    for (std::size_t k = 0; k < length; ++k) base[k] = kFiller[k % kFiller.size()];
    check(base);
    for (const char special : specials) {
      check(std::string(length, special));
      for (std::size_t at = 0; at < length; ++at) {
        std::string in = base;
        in[at] = special;
        check(in);
      }
    }
  }
}

// Every byte value, each between two plain letters.
inline std::string every_byte_value() {
  std::string s;
  for (int b = 0; b < 256; ++b) s += std::string("a") + static_cast<char>(b) + "b";
  return s;
}

// Length of the well-formed UTF-8 sequence that s starts with, 0 when it
// starts with none: decodes the bits and asks whether the code point is in
// range, not a surrogate and encoded in its shortest form.
inline std::size_t utf8_model_length(std::span<const std::uint8_t> s) {
  if (s.empty()) return 0;
  const std::uint8_t c = s[0];
  if (c < 0x80) return 1;
  const std::size_t len = c >= 0xF0 ? 4 : c >= 0xE0 ? 3 : c >= 0xC0 ? 2 : 0;
  if (len == 0 || c >= 0xF8 || s.size() < len) return 0;
  std::uint32_t cp = c & (0x7F >> len);
  for (std::size_t k = 1; k < len; ++k) {
    if ((s[k] & 0xC0) != 0x80) return 0;
    cp = (cp << 6) | (s[k] & 0x3F);
  }
  const std::size_t shortest = cp < 0x80 ? 1 : cp < 0x800 ? 2 : cp < 0x10000 ? 3 : 4;
  if (shortest != len || cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF)) return 0;
  return len;
}

}  // namespace zul::testing_sweep
