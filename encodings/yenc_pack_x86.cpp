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

#include "common/targets.h"
#include "encodings/yenc_pack.h"

namespace zul::encodings::detail {
namespace {

using yenc_pack::escapes;
using yenc_pack::finish;
using yenc_pack::kKept;
using yenc_pack::kPack;

// 0xFF in each byte lane whose bit of bits is set.
ZUL_AVX2 inline __m256i lanes_of(std::uint32_t bits) {
  const __m256i spread =
      _mm256_shuffle_epi8(_mm256_set1_epi32(static_cast<int>(bits)),
                          _mm256_setr_epi8(0, 0, 0, 0, 0, 0, 0, 0, 1, 1, 1, 1, 1, 1, 1, 1, 2, 2, 2,
                                           2, 2, 2, 2, 2, 3, 3, 3, 3, 3, 3, 3, 3));
  const __m256i bit = _mm256_set1_epi64x(static_cast<long long>(0x8040201008040201ull));
  return _mm256_cmpeq_epi8(_mm256_and_si256(spread, bit), bit);
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
