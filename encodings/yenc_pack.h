// Shared by the yEnc kernels that have no compress instruction (SSSE3 and
// AVX2 in yenc_pack_x86.cpp, NEON in yenc_neon.cpp): the escape rule on a
// block's lane mask, the tables that pack an 8-lane group's kept bytes to
// the front with one byte shuffle, and the scalar finish after the blocks.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "encodings/yenc_kernels.h"

namespace zul::encodings::detail::yenc_pack {

// For each 8-bit mask of kept lanes, the shuffle indices of those lanes
// packed to the front, little-endian in a 64-bit word; unused bytes are
// 0x80 (the shuffle zeroes them, also after 8 is added to each index).
inline constexpr std::array<std::uint64_t, 256> kPack = [] {
  std::array<std::uint64_t, 256> t{};
  for (unsigned m = 0; m < 256; ++m) {
    std::uint64_t word = 0;
    unsigned k = 0;
    for (unsigned lane = 0; lane < 8; ++lane) {
      if (m & (1u << lane)) word |= std::uint64_t{lane} << (8 * k++);
    }
    for (; k < 8; ++k) word |= std::uint64_t{0x80} << (8 * k);
    t[m] = word;
  }
  return t;
}();

// Kept lanes per 8-bit mask (no POPCNT at the SSSE3 level: some CPUs with
// SSSE3 lack it).
inline constexpr std::array<std::uint8_t, 256> kKept = [] {
  std::array<std::uint8_t, 256> t{};
  for (unsigned m = 0; m < 256; ++m) t[m] = static_cast<std::uint8_t>(__builtin_popcount(m));
  return t;
}();

// The lanes of one block (bits of Mask) that an "=" escapes, given the
// lanes holding "=" and whether the previous block's last lane escapes the
// first; carry becomes whether this block's last lane escapes the next.
template <class Mask>
inline Mask escapes(Mask eq, bool& carry) {
  constexpr unsigned kLast = 8 * sizeof(Mask) - 1;
  Mask escaped = carry ? 1 : 0;
  Mask pending = eq & static_cast<Mask>(~escaped);
  carry = false;
  if ((pending & static_cast<Mask>(pending << 1)) == 0) {
    // No two "=" in a row (the usual case): each escapes the next lane.
    carry = (pending >> kLast) != 0;
    return escaped | static_cast<Mask>(pending << 1);
  }
  while (pending != 0) {
    const unsigned j = static_cast<unsigned>(__builtin_ctz(pending));
    if (j == kLast) {
      carry = true;
      break;
    }
    escaped |= static_cast<Mask>(Mask{2} << j);
    // Clear the "=" at j and the lane it escapes.
    pending &= static_cast<Mask>(~(Mask{3} << j));
  }
  return escaped;
}

// The rest after the blocks: if the last block ended with an unescaped
// "=", its escaped byte is the first of the rest (or, at the very end, an
// implied zero).
inline std::size_t finish(const std::uint8_t* in, std::size_t i, std::size_t n, bool carry,
                          std::uint8_t* out, std::uint8_t* o) {
  if (carry) {
    const std::uint8_t escaped = i < n ? in[i] : 0;
    *o++ = static_cast<std::uint8_t>(escaped - 64 - 42);
    if (i < n) ++i;
  }
  return static_cast<std::size_t>(o - out) + decode_yenc_scalar(in + i, n - i, o);
}

}  // namespace zul::encodings::detail::yenc_pack
