// yEnc decoding for SSSE3 (16 bytes per block) and AVX2 (32 bytes). The
// escape rule is the one of the AVX-512 kernel (encodings/yenc_x86.cpp) on
// 16- or 32-bit masks: an "=" that is not itself escaped escapes the next
// lane, the last lane's escape carries into the next block, and every "="
// that escapes is dropped.
//
// Neither has a compress instruction. A block with nothing to drop is stored
// whole (most blocks of real data); otherwise each 8-lane group is packed
// with one byte shuffle whose indices come from a 256-entry table (the
// positions of the kept lanes, in order) and stored as 8 bytes, of which
// only the kept ones count. The output never runs ahead of the input, so
// every 8-byte store stays inside an output buffer of the input's size.
#include "encodings/yenc_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include <array>

#define ZUL_SSSE3 __attribute__((target("ssse3")))
#define ZUL_AVX2 __attribute__((target("avx2,bmi,bmi2")))

namespace zul::encodings::detail {
namespace {

// For each 8-bit mask of kept lanes, the shuffle indices of those lanes
// packed to the front, little-endian in a 64-bit word; unused bytes are
// 0x80 (the shuffle zeroes them, also after 8 is added to each index).
constexpr std::array<std::uint64_t, 256> kPack = [] {
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
constexpr std::array<std::uint8_t, 256> kKept = [] {
  std::array<std::uint8_t, 256> t{};
  for (unsigned m = 0; m < 256; ++m) t[m] = static_cast<std::uint8_t>(__builtin_popcount(m));
  return t;
}();

// 0xFF in each byte lane whose bit of bits is set.
ZUL_AVX2 inline __m256i lanes_of(std::uint32_t bits) {
  const __m256i spread =
      _mm256_shuffle_epi8(_mm256_set1_epi32(static_cast<int>(bits)),
                          _mm256_setr_epi8(0, 0, 0, 0, 0, 0, 0, 0, 1, 1, 1, 1, 1, 1, 1, 1, 2, 2, 2,
                                           2, 2, 2, 2, 2, 3, 3, 3, 3, 3, 3, 3, 3));
  const __m256i bit = _mm256_set1_epi64x(static_cast<long long>(0x8040201008040201ull));
  return _mm256_cmpeq_epi8(_mm256_and_si256(spread, bit), bit);
}

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

// Stores the kept lanes of one 16-byte half (keep: 16 bits), packed.
ZUL_SSSE3 inline std::uint8_t* pack_half(__m128i half, unsigned keep, std::uint8_t* o) {
  const unsigned lo = keep & 0xFF, hi = keep >> 8;
  const __m128i index = _mm_set_epi64x(static_cast<long long>(kPack[hi] + 0x0808080808080808ull),
                                       static_cast<long long>(kPack[lo]));
  const __m128i packed = _mm_shuffle_epi8(half, index);
  _mm_storel_epi64(reinterpret_cast<__m128i*>(o), packed);
  o += kKept[lo];
  _mm_storel_epi64(reinterpret_cast<__m128i*>(o), _mm_unpackhi_epi64(packed, packed));
  return o + kKept[hi];
}

// The rest after the blocks: if the last block ended with an unescaped
// "=", its escaped byte is the first of the rest (or, at the very end, an
// implied zero).
std::size_t finish(const std::uint8_t* in, std::size_t i, std::size_t n, bool carry,
                   std::uint8_t* out, std::uint8_t* o) {
  if (carry) {
    const std::uint8_t escaped = i < n ? in[i] : 0;
    *o++ = static_cast<std::uint8_t>(escaped - 64 - 42);
    if (i < n) ++i;
  }
  return static_cast<std::size_t>(o - out) + decode_yenc_scalar(in + i, n - i, o);
}

}  // namespace

ZUL_SSSE3 std::size_t decode_yenc_ssse3(const std::uint8_t* in, std::size_t n,
                                        std::uint8_t* out) noexcept {
  const __m128i equals = _mm_set1_epi8('=');
  const __m128i k42 = _mm_set1_epi8(42);
  const __m128i k64 = _mm_set1_epi8(64);
  const __m128i spread = _mm_setr_epi8(0, 0, 0, 0, 0, 0, 0, 0, 1, 1, 1, 1, 1, 1, 1, 1);
  const __m128i bit = _mm_set1_epi64x(static_cast<long long>(0x8040201008040201ull));
  std::uint8_t* o = out;
  std::size_t i = 0;
  bool carry = false;
  for (; n - i >= 16; i += 16) {
    const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i));
    const __m128i value = _mm_sub_epi8(v, k42);
    const auto eq = static_cast<std::uint16_t>(_mm_movemask_epi8(_mm_cmpeq_epi8(v, equals)));
    if ((eq | static_cast<unsigned>(carry)) == 0) {
      _mm_storeu_si128(reinterpret_cast<__m128i*>(o), value);
      o += 16;
      continue;
    }
    const std::uint16_t escaped = escapes(eq, carry);
    const __m128i lanes = _mm_shuffle_epi8(_mm_set1_epi16(static_cast<short>(escaped)), spread);
    const __m128i is_escaped = _mm_cmpeq_epi8(_mm_and_si128(lanes, bit), bit);
    const __m128i decoded = _mm_sub_epi8(value, _mm_and_si128(is_escaped, k64));
    o = pack_half(decoded, static_cast<std::uint16_t>(~(eq & ~escaped)), o);
  }
  return finish(in, i, n, carry, out, o);
}

ZUL_AVX2 std::size_t decode_yenc_avx2(const std::uint8_t* in, std::size_t n,
                                      std::uint8_t* out) noexcept {
  const __m256i equals = _mm256_set1_epi8('=');
  const __m256i k42 = _mm256_set1_epi8(42);
  const __m256i k64 = _mm256_set1_epi8(64);
  std::uint8_t* o = out;
  std::size_t i = 0;
  bool carry = false;  // the previous block ended with an unescaped "="
  for (; n - i >= 32; i += 32) {
    const __m256i v = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i));
    const __m256i value = _mm256_sub_epi8(v, k42);
    const auto eq = static_cast<std::uint32_t>(_mm256_movemask_epi8(_mm256_cmpeq_epi8(v, equals)));
    if ((eq | static_cast<std::uint32_t>(carry)) == 0) {
      _mm256_storeu_si256(reinterpret_cast<__m256i*>(o), value);
      o += 32;
      continue;
    }
    const std::uint32_t escaped = escapes(eq, carry);
    const std::uint32_t keep = ~(eq & ~escaped);
    const __m256i decoded = _mm256_sub_epi8(value, _mm256_and_si256(lanes_of(escaped), k64));
    if (keep == 0xFFFFFFFFu) {
      _mm256_storeu_si256(reinterpret_cast<__m256i*>(o), decoded);
      o += 32;
      continue;
    }
    o = pack_half(_mm256_castsi256_si128(decoded), keep & 0xFFFF, o);
    o = pack_half(_mm256_extracti128_si256(decoded, 1), keep >> 16, o);
  }
  return finish(in, i, n, carry, out, o);
}

}  // namespace zul::encodings::detail
#endif
