// x86-64 kernels for the single-byte character sets. Decoding widens a
// block of bytes to units with zero extension and stores it; lanes holding
// 80..9F are then patched from the table (AVX-512: one 32-unit permute of
// the whole block). Encoding narrows a block of units to bytes and stores
// it whole; the few units that are not plain 00..FF values of the set take
// the table look-up in place (finish_block), and denser blocks are finished
// from the first such unit (the output never passes the input, so the
// whole-block store always has room).
// Compiled on x86-64 only; other targets get an empty unit.
#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"
#include "text/latin1.h"

namespace zul::text::detail {
namespace {

// Lanes (bit k = unit k) that need the table when encoding.
inline unsigned exception_bits(std::uint32_t high_mask, std::uint32_t c1_mask, bool c1_identity) {
  return c1_identity ? high_mask : (high_mask | c1_mask);
}

// Units in[0, count) one at a time through the reverse map; returns the
// bytes written. Branch-free: a dropped unit's byte is written and then
// overwritten (the output never passes the input).
inline std::size_t encode_units(const std::uint16_t* in, std::size_t count, std::uint8_t* out,
                                const single_byte_charset& set) {
  std::size_t o = 0;
  for (std::size_t j = 0; j < count; ++j) {
    const int b = byte_for_unit(set, in[j]);
    out[o] = static_cast<std::uint8_t>(b);
    o += b >= 0;
  }
  return o;
}

// The rest of a block whose lanes in m need the table; out[o, o + block)
// holds the block narrowed. When patch is set (a set that holds units
// beyond 00..FF) and there are few such lanes (typical text: a sign or a
// quotation mark now and then), each takes the look-up in place and, when
// the set holds them all, the next block starts after this one. Otherwise,
// from the first such lane k: a lone one takes the look-up and the next
// block starts after it; with more than one, the rest of the block goes unit
// by unit.
// A set that keeps 80..9F and holds no unit from 0x100 up (ISO 8859-1)
// drops every such lane, so they need no look-up: a block of nothing else is
// skipped, a lone one is stepped over (the next block starts after it), and
// otherwise the rest of the block keeps its units below 0x100.
inline void finish_block(const std::uint16_t* in, std::uint8_t* out, unsigned m, unsigned block,
                         const single_byte_charset& set, bool patch, std::size_t& i,
                         std::size_t& o) {
  if (!patch && set.hash_multiplier == 0) {
    const unsigned k = static_cast<unsigned>(__builtin_ctz(m));
    if ((m & (m - 1)) == 0) {
      i += k + 1;
      o += k;
      return;
    }
    if (m == (block == 32 ? ~0u : (1u << block) - 1)) {
      i += block;
      return;
    }
    o += k;
    for (std::size_t j = i + k; j < i + block; ++j) {
      out[o] = static_cast<std::uint8_t>(in[j]);
      o += in[j] < 0x100;
    }
    i += block;
    return;
  }
  if (patch && __builtin_popcount(m) <= 4) {
    std::uint8_t* const first = out + o;
    const std::uint16_t* const units = in + i;
    unsigned left = m;
    for (; left != 0; left &= left - 1) {
      const unsigned lane = static_cast<unsigned>(__builtin_ctz(left));
      const int b = byte_for_unit(set, units[lane]);
      if (b < 0) break;
      first[lane] = static_cast<std::uint8_t>(b);
    }
    if (left == 0) {
      i += block;
      o += block;
      return;
    }
  }
  const unsigned k = static_cast<unsigned>(__builtin_ctz(m));
  const unsigned rest = (m & (m - 1)) == 0 ? 1 : block - k;
  o += k + encode_units(in + i + k, rest, out + o + k, set);
  i += k + rest;
}

// Patches the lanes of a decoded block that hold 80..9F (bits of mask)
// from c1: one by one when there are at most two, else the whole block
// through the full table (c1 is its row 80..9F), which costs no branch
// per lane.
inline void patch_block(const std::uint8_t* in, std::uint16_t* out, std::uint32_t mask,
                        unsigned block, const std::uint16_t* c1) {
  if (mask == 0) return;
  if (__builtin_popcount(mask) <= 2) {
    for (; mask != 0; mask &= mask - 1) {
      const unsigned k = static_cast<unsigned>(__builtin_ctz(mask));
      out[k] = c1[in[k] - 0x80];
    }
    return;
  }
  const std::uint16_t* table = c1 - 0x80;
  for (unsigned k = 0; k < block; ++k) out[k] = table[in[k]];
}

// ---- SSE2: 16 bytes or 16 units a block ----

std::size_t decode_sse2(const std::uint8_t* in, std::size_t n, std::uint16_t* out,
                        const std::uint16_t* c1) noexcept {
  const __m128i zero = _mm_setzero_si128();
  std::size_t i = 0;
  for (; i + 16 <= n; i += 16) {
    const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out + i), _mm_unpacklo_epi8(v, zero));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out + i + 8), _mm_unpackhi_epi8(v, zero));
    if (c1 == nullptr) continue;
    // 80..9F are the bytes whose top three bits are 100.
    unsigned mask = static_cast<unsigned>(
        _mm_movemask_epi8(_mm_cmpeq_epi8(_mm_and_si128(v, _mm_set1_epi8(static_cast<char>(0xE0))),
                                         _mm_set1_epi8(static_cast<char>(0x80)))));
    patch_block(in + i, out + i, mask, 16, c1);
  }
  return i;
}

std::size_t encode_sse2(const std::uint16_t* in, std::size_t n, std::uint8_t* out,
                        const single_byte_charset& set, std::size_t* written) noexcept {
  const bool c1_identity = set.low(0x80) == 0x80;
  const __m128i zero = _mm_setzero_si128();
  const __m128i high = _mm_set1_epi16(static_cast<short>(0xFF00));
  const __m128i c1_bits = _mm_set1_epi16(static_cast<short>(0xFFE0));
  const __m128i c1_value = _mm_set1_epi16(0x0080);
  std::size_t i = 0, o = 0;
  while (i + 16 <= n) {
    const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i));
    const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i + 8));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out + o), _mm_packus_epi16(a, b));
    // One mask bit per byte of the packed compare results: two per unit.
    const auto high_mask = static_cast<std::uint32_t>(_mm_movemask_epi8(_mm_packs_epi16(
        _mm_xor_si128(_mm_cmpeq_epi16(_mm_and_si128(a, high), zero), _mm_set1_epi16(-1)),
        _mm_xor_si128(_mm_cmpeq_epi16(_mm_and_si128(b, high), zero), _mm_set1_epi16(-1)))));
    const auto c1_mask = static_cast<std::uint32_t>(
        _mm_movemask_epi8(_mm_packs_epi16(_mm_cmpeq_epi16(_mm_and_si128(a, c1_bits), c1_value),
                                          _mm_cmpeq_epi16(_mm_and_si128(b, c1_bits), c1_value))));
    const unsigned m = exception_bits(high_mask, c1_mask, c1_identity);
    if (m == 0) {
      i += 16;
      o += 16;
      continue;
    }
    finish_block(in, out, m, 16, set, !c1_identity, i, o);
  }
  *written = o;
  return i;
}

// ---- AVX2: 32 bytes or 32 units a block ----

ZUL_AVX2 std::size_t decode_avx2(const std::uint8_t* in, std::size_t n, std::uint16_t* out,
                                 const std::uint16_t* c1) noexcept {
  std::size_t i = 0;
  for (; i + 32 <= n; i += 32) {
    const __m256i v = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i));
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + i),
                        _mm256_cvtepu8_epi16(_mm256_castsi256_si128(v)));
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + i + 16),
                        _mm256_cvtepu8_epi16(_mm256_extracti128_si256(v, 1)));
    if (c1 == nullptr) continue;
    // 80..9F are the bytes whose top three bits are 100.
    const __m256i top3 = _mm256_and_si256(v, _mm256_set1_epi8(static_cast<char>(0xE0)));
    auto mask = static_cast<std::uint32_t>(
        _mm256_movemask_epi8(_mm256_cmpeq_epi8(top3, _mm256_set1_epi8(static_cast<char>(0x80)))));
    patch_block(in + i, out + i, mask, 32, c1);
  }
  return i;
}

// A block is first tested whole: packus turns a unit from 0x100 up into 00
// or FF, never into 80..9F, so the C1 units are the narrowed bytes whose top
// three bits are 100 (where the set keeps 80..9F the compare looks for 01
// there, which never matches), and the units from 0x100 up show in the high
// bytes of both registers at once. A block that fails the test and has one
// such unit (typical text: a sign or a quotation mark now and then) is done
// without a further branch on its lane: ISO 8859-1 drops the unit by
// blending in the block moved down one byte from its lane on; Windows-1252
// writes the unit's byte over its lane. Blocks with more, or whose one unit
// Windows-1252 drops, take finish_block.
ZUL_AVX2 std::size_t encode_avx2(const std::uint16_t* in, std::size_t n, std::uint8_t* out,
                                 const single_byte_charset& set, std::size_t* written) noexcept {
  const bool c1_identity = set.low(0x80) == 0x80;
  const bool drops_all = c1_identity && set.hash_multiplier == 0;
  const __m256i zero = _mm256_setzero_si256();
  const __m256i high = _mm256_set1_epi16(static_cast<short>(0xFF00));
  const __m256i top3 = _mm256_set1_epi8(static_cast<char>(0xE0));
  const __m256i c1_value = _mm256_set1_epi8(static_cast<char>(c1_identity ? 0x01 : 0x80));
  // 32 zero bytes, then 32 bytes FF: read from 32 - k, lane j is FF from j = k on.
  alignas(64) static constexpr std::uint8_t kFrom[64] = {
      0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,
      0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,    0,
      0,    0,    0,    0,    0,    0,    0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF,
      0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF,
      0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};
  std::size_t i = 0, o = 0;
  while (i + 32 <= n) {
    const __m256i a = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i));
    const __m256i b = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i + 16));
    // packus works within 128-bit lanes; the permute puts the quarters back
    // in order (a0 b0 a1 b1 -> a0 a1 b0 b1).
    const __m256i packed = _mm256_permute4x64_epi64(_mm256_packus_epi16(a, b), 0xD8);
    const __m256i c1 = _mm256_cmpeq_epi8(_mm256_and_si256(packed, top3), c1_value);
    const __m256i any = _mm256_or_si256(_mm256_and_si256(_mm256_or_si256(a, b), high), c1);
    if (_mm256_testz_si256(any, any)) {
      _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + o), packed);
      i += 32;
      o += 32;
      continue;
    }
    const __m256i highs = _mm256_permute4x64_epi64(
        _mm256_packus_epi16(_mm256_srli_epi16(a, 8), _mm256_srli_epi16(b, 8)), 0xD8);
    const unsigned m =
        ~static_cast<std::uint32_t>(_mm256_movemask_epi8(_mm256_cmpeq_epi8(highs, zero))) |
        static_cast<std::uint32_t>(_mm256_movemask_epi8(c1));
    const unsigned k = _tzcnt_u32(m);  // m is not 0: the block failed the test
    if (drops_all) {
      if ((m & (m - 1)) == 0) {
        const __m256i next =
            _mm256_alignr_epi8(_mm256_permute2x128_si256(packed, packed, 0x81), packed, 1);
        const __m256i from_k = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(kFrom + 32 - k));
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + o),
                            _mm256_blendv_epi8(packed, next, from_k));
        i += 32;
        o += 31;
        continue;
      }
    } else if ((m & (m - 1)) == 0) {
      _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + o), packed);
      const int byte = byte_for_unit(set, in[i + k]);
      if (byte >= 0) {
        out[o + k] = static_cast<std::uint8_t>(byte);
        i += 32;
        o += 32;
        continue;
      }
    }
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + o), packed);
    finish_block(in, out, m, 32, set, !c1_identity, i, o);
  }
  *written = o;
  return i;
}

// ---- AVX-512: 64 bytes or 32 units a block ----

ZUL_AVX512 std::size_t decode_avx512(const std::uint8_t* in, std::size_t n, std::uint16_t* out,
                                     const std::uint16_t* c1) noexcept {
  // The 32 units of 80..9F fill one register: a permute indexed by the low
  // five bits of each byte looks all of them up at once.
  const __m512i table = c1 != nullptr ? _mm512_loadu_si512(c1) : _mm512_setzero_si512();
  const __m512i top3 = _mm512_set1_epi16(0xE0);
  const __m512i c1_value = _mm512_set1_epi16(0x80);
  std::size_t i = 0;
  for (; i + 32 <= n; i += 32) {
    const __m512i wide =
        _mm512_cvtepu8_epi16(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i)));
    __m512i units = wide;
    if (c1 != nullptr) {
      const __mmask32 m = _mm512_cmpeq_epi16_mask(_mm512_and_si512(wide, top3), c1_value);
      units = _mm512_mask_permutexvar_epi16(wide, m, wide, table);
    }
    _mm512_storeu_si512(out + i, units);
  }
  return i;
}

ZUL_AVX512 std::size_t encode_avx512(const std::uint16_t* in, std::size_t n, std::uint8_t* out,
                                     const single_byte_charset& set,
                                     std::size_t* written) noexcept {
  const bool c1_identity = set.low(0x80) == 0x80;
  const __m512i high = _mm512_set1_epi16(static_cast<short>(0xFF00));
  const __m512i c1_bits = _mm512_set1_epi16(static_cast<short>(0xFFE0));
  const __m512i c1_value = _mm512_set1_epi16(0x0080);
  std::size_t i = 0, o = 0;
  while (i + 32 <= n) {
    const __m512i v = _mm512_loadu_si512(in + i);
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + o),
                        _mm512_maskz_cvtepi16_epi8(~__mmask32{0}, v));
    const auto high_mask = static_cast<std::uint32_t>(_mm512_test_epi16_mask(v, high));
    const auto c1_mask =
        static_cast<std::uint32_t>(_mm512_cmpeq_epi16_mask(_mm512_and_si512(v, c1_bits), c1_value));
    const unsigned m = exception_bits(high_mask, c1_mask, c1_identity);
    if (m == 0) {
      i += 32;
      o += 32;
      continue;
    }
    finish_block(in, out, m, 32, set, !c1_identity, i, o);
  }
  *written = o;
  return i;
}

}  // namespace

const single_byte_kernels kSingleByteSse2{decode_sse2, encode_sse2};
const single_byte_kernels kSingleByteAvx2{decode_avx2, encode_avx2};
const single_byte_kernels kSingleByteAvx512{decode_avx512, encode_avx512};

}  // namespace zul::text::detail

#endif  // x86-64
