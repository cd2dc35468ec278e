// Encoding to a single-byte set with AVX-512 VBMI and VBMI2, 64 UTF-16
// units a block:
//   low, high = the units' low and high bytes, de-interleaved from two
//               registers by byte permutes (VPERMT2B);
//   special   = units of 0x100 and up, and (Windows-1252) the C1 units
//               80..9F, which the set does not hold as themselves;
//   mapped    = special units that the set holds: a perfect hash of the
//               unit (a multiply and a shift) picks a slot of a 64-entry
//               table (16-bit permutes of two registers), whose unit must
//               equal it and whose byte it takes (one half of the block
//               only, when the other has no such unit);
// a block without special units is stored whole; otherwise the low bytes,
// with the mapped ones patched in, are compressed over the dropped units
// (VPCOMPRESSB) and stored whole. The output never passes the input, so the
// whole-register store stays inside the output. The tail runs the same
// steps with masked loads and a masked store.
#include "text/latin1.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"

namespace zul::text::detail {
namespace {

struct hash_lookup {
  __m512i multiplier, units_lo, units_hi, bytes_lo, bytes_hi;
};

// Which of the 32 units of v the hash finds (only meaningful for units of
// 0x100 and up) and, in their lanes of *bytes, the bytes that encode them.
ZUL_AVX512_VBMI2 inline __mmask32 map_high(const hash_lookup& h, __m512i v, __m512i* bytes) {
  const __m512i slot = _mm512_srli_epi16(_mm512_mullo_epi16(v, h.multiplier), 10);
  *bytes = _mm512_permutex2var_epi16(h.bytes_lo, slot, h.bytes_hi);
  return _mm512_cmpeq_epi16_mask(_mm512_permutex2var_epi16(h.units_lo, slot, h.units_hi), v);
}

ZUL_AVX512_VBMI2 std::size_t encode_avx512_vbmi2(const std::uint16_t* in, std::size_t n,
                                                 std::uint8_t* out, const single_byte_charset& set,
                                                 std::size_t* written) noexcept {
  const bool c1_identity = set.low(0x80) == 0x80;
  const bool has_high = set.hash_multiplier != 0;
  const hash_lookup h{
      _mm512_set1_epi16(static_cast<short>(set.hash_multiplier)),
      _mm512_loadu_si512(set.hash_units.data()), _mm512_loadu_si512(set.hash_units.data() + 32),
      _mm512_loadu_si512(set.hash_bytes.data()), _mm512_loadu_si512(set.hash_bytes.data() + 32)};
  // Byte k of the permute index is 2k (low bytes) or 2k + 1 (high bytes);
  // indexes from 64 up pick from the second register.
  alignas(64) std::uint8_t even[64], odd[64];
  for (int k = 0; k < 64; ++k) {
    even[k] = static_cast<std::uint8_t>(2 * k);
    odd[k] = static_cast<std::uint8_t>(2 * k + 1);
  }
  const __m512i even_bytes = _mm512_load_si512(even), odd_bytes = _mm512_load_si512(odd);
  const __m512i top3 = _mm512_set1_epi8(static_cast<char>(0xE0));
  const __m512i c1_value = _mm512_set1_epi8(static_cast<char>(0x80));
  std::size_t i = 0, o = 0;
  while (i < n) {
    const std::size_t left = n - i;
    const std::uint64_t lanes = left >= 64 ? ~std::uint64_t{0} : (std::uint64_t{1} << left) - 1;
    const __m512i a = _mm512_maskz_loadu_epi16(static_cast<__mmask32>(lanes), in + i);
    const __m512i b = _mm512_maskz_loadu_epi16(static_cast<__mmask32>(lanes >> 32), in + i + 32);
    __m512i low = _mm512_permutex2var_epi8(a, even_bytes, b);
    const __m512i high = _mm512_permutex2var_epi8(a, odd_bytes, b);
    const std::uint64_t wide = _mm512_test_epi8_mask(high, high);
    std::uint64_t special = wide;
    if (!c1_identity) {
      special |= _mm512_cmpeq_epi8_mask(_mm512_and_si512(low, top3), c1_value);
    }
    if (special == 0 && left >= 64) {
      _mm512_storeu_si512(out + o, low);
      i += 64;
      o += 64;
      continue;
    }
    std::uint64_t keep = ~special & lanes;
    if (has_high && wide != 0) {
      std::uint64_t held;
      if (static_cast<std::uint32_t>(wide) != 0 && (wide >> 32) != 0) {
        __m512i bytes_a, bytes_b;
        held = map_high(h, a, &bytes_a) | std::uint64_t{map_high(h, b, &bytes_b)} << 32;
        low = _mm512_mask_mov_epi8(low, held & wide,
                                   _mm512_permutex2var_epi8(bytes_a, even_bytes, bytes_b));
      } else {
        // Units from 0x100 up in one half only (typical text): hash that
        // half, its bytes copied to both halves of the block.
        const unsigned shift = static_cast<std::uint32_t>(wide) == 0 ? 32 : 0;
        const __m512i half = _mm512_mask_mov_epi16(a, shift != 0 ? ~__mmask32{0} : 0, b);
        __m512i bytes;
        held = std::uint64_t{map_high(h, half, &bytes)} << shift;
        low = _mm512_mask_mov_epi8(low, held & wide,
                                   _mm512_permutex2var_epi8(bytes, even_bytes, bytes));
      }
      held &= wide;
      keep |= held;
    }
    if (keep == ~std::uint64_t{0}) {  // all held (typical Windows-1252 text)
      _mm512_storeu_si512(out + o, low);
      i += 64;
      o += 64;
      continue;
    }
    const __m512i packed = _mm512_maskz_compress_epi8(keep, low);
    const auto count = static_cast<std::size_t>(__builtin_popcountll(keep));
    if (left >= 64) {
      _mm512_storeu_si512(out + o, packed);
      i += 64;
    } else {
      _mm512_mask_storeu_epi8(out + o, (std::uint64_t{1} << count) - 1, packed);
      i = n;
    }
    o += count;
  }
  *written = o;
  return i;
}

}  // namespace

const single_byte_kernels kSingleByteAvx512Vbmi2{kSingleByteAvx512.decode, encode_avx512_vbmi2};

}  // namespace zul::text::detail

#endif  // x86-64
