// x86-64 block kernels for UTF-8 well-formedness (lookup-table method, with
// the tables of common/utf8_classes.h). A block of ASCII is checked only
// for a sequence that the previous block left open. The SSE2 level lacks
// byte shuffles and copies ASCII blocks only.
// For text dense with faults, keep masks judge every byte on its own: it is
// kept when a well-formed sequence (found by plain comparisons of its four
// bytes) covers it, and the repair replaces the others a block at a time.
// Compiled on x86-64 only; other targets get an empty unit.
#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"
#include "common/utf8_classes.h"
#include "common/utf8_valid.h"

namespace zul::simd::detail {
namespace {

using namespace utf8_classes;

// A 16-entry table repeated four times: one load fills every 128-bit lane.
struct lane_table {
  alignas(64) std::uint8_t bytes[64];
};
constexpr lane_table repeat4(const std::uint8_t (&t)[16]) {
  lane_table r{};
  for (int k = 0; k < 64; ++k) r.bytes[k] = t[k % 16];
  return r;
}
constexpr lane_table kByte1HighX4 = repeat4(kByte1High);
constexpr lane_table kByte1LowX4 = repeat4(kByte1Low);
constexpr lane_table kByte2HighX4 = repeat4(kByte2High);

// Subtracted with saturation from a block's last three bytes: a result
// above zero means a sequence still open at the block's end (a lead of
// F0..FF three bytes from the end, E0..FF two, C0..FF one).
constexpr lane_table open_at_end(int block) {
  lane_table r{};
  for (int k = 0; k < 64; ++k) r.bytes[k] = 0xFF;
  r.bytes[block - 3] = 0xEF;
  r.bytes[block - 2] = 0xDF;
  r.bytes[block - 1] = 0xBF;
  return r;
}
constexpr lane_table kOpenAtEnd32 = open_at_end(32);
constexpr lane_table kOpenAtEnd64 = open_at_end(64);

// ---- SSE2: ASCII blocks only ----

std::size_t copy_valid_sse2(const std::uint8_t* in, std::size_t n, std::uint8_t* out) noexcept {
  std::size_t i = 0;
  for (; i + 16 <= n; i += 16) {
    const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i));
    if (_mm_movemask_epi8(v) != 0) break;
    if (out != nullptr) _mm_storeu_si128(reinterpret_cast<__m128i*>(out + i), v);
  }
  return i;
}

// ---- AVX2: 32-byte blocks ----

// The 32 bytes before each byte of v, N back: from prev where they precede v.
template <int N>
ZUL_AVX2 inline __m256i prev_avx2(__m256i v, __m256i prev) {
  return _mm256_alignr_epi8(v, _mm256_permute2x128_si256(prev, v, 0x21), 16 - N);
}

ZUL_AVX2 inline __m256i load_avx2(const lane_table& t) {
  return _mm256_load_si256(reinterpret_cast<const __m256i*>(t.bytes));
}

// The lookup tables and constants of the AVX2 check, loaded once per call.
struct avx2_consts {
  __m256i byte1_high, byte1_low, byte2_high, nibble, open_at_end;
};

// Error bits for the 32 bytes v, given the bytes 1, 2 and 3 before each.
ZUL_AVX2 inline __m256i errors_avx2(const avx2_consts& k, __m256i v, __m256i prev1, __m256i prev2,
                                    __m256i prev3) {
  const __m256i special = _mm256_and_si256(
      _mm256_and_si256(_mm256_shuffle_epi8(k.byte1_high,
                                           _mm256_and_si256(_mm256_srli_epi16(prev1, 4), k.nibble)),
                       _mm256_shuffle_epi8(k.byte1_low, _mm256_and_si256(prev1, k.nibble))),
      _mm256_shuffle_epi8(k.byte2_high, _mm256_and_si256(_mm256_srli_epi16(v, 4), k.nibble)));
  const __m256i third = _mm256_subs_epu8(prev2, _mm256_set1_epi8(0x60));
  const __m256i fourth = _mm256_subs_epu8(prev3, _mm256_set1_epi8(0x70));
  const __m256i must23 =
      _mm256_and_si256(_mm256_or_si256(third, fourth), _mm256_set1_epi8(static_cast<char>(0x80)));
  return _mm256_xor_si256(must23, special);
}

ZUL_AVX2 inline __m256i load(const std::uint8_t* q) {
  return _mm256_loadu_si256(reinterpret_cast<const __m256i*>(q));
}

// Error bits for the 32 bytes v at offset at of in (at >= 3).
ZUL_AVX2 inline __m256i check_at_avx2(const avx2_consts& k, const std::uint8_t* in, __m256i v,
                                      std::size_t at) {
  return errors_avx2(k, v, load(in + at - 1), load(in + at - 2), load(in + at - 3));
}

ZUL_AVX2 std::size_t copy_valid_avx2(const std::uint8_t* in, std::size_t n,
                                     std::uint8_t* out) noexcept {
  const avx2_consts k{load_avx2(kByte1HighX4), load_avx2(kByte1LowX4), load_avx2(kByte2HighX4),
                      _mm256_set1_epi8(0x0F), load_avx2(kOpenAtEnd32)};
  if (n < 32) return 0;
  // The first block: the bytes before it count as ASCII.
  __m256i v = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in));
  const __m256i zero = _mm256_setzero_si256();
  __m256i error =
      errors_avx2(k, v, prev_avx2<1>(v, zero), prev_avx2<2>(v, zero), prev_avx2<3>(v, zero));
  __m256i open = _mm256_subs_epu8(v, k.open_at_end);
  if (!_mm256_testz_si256(error, error)) return 0;
  if (out != nullptr) _mm256_storeu_si256(reinterpret_cast<__m256i*>(out), v);
  // Later blocks read the bytes before them again from memory: unaligned
  // loads are cheaper than the lane shuffles that would rebuild them. Pairs
  // of blocks first, with one test for both; the single blocks below find
  // the faulty one of a pair, and take the last block.
  std::size_t i = 32;
  for (; i + 32 <= n; i += 32) {
    v = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + i));
    error = open;
    if (_mm256_movemask_epi8(v) != 0) {
      // The check covers a sequence left open by the block before.
      error = check_at_avx2(k, in, v, i);
      open = _mm256_subs_epu8(v, k.open_at_end);
    }
    if (!_mm256_testz_si256(error, error)) break;
    if (out != nullptr) _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + i), v);
  }
  return utf8_boundary_before(in, i);
}

// ---- AVX-512: 64-byte blocks ----

template <int N>
ZUL_AVX512 inline __m512i prev_avx512(__m512i v, __m512i prev) {
  // Lanes of the previous 16 bytes: prev's last lane, then v's lanes 0..2.
  const __m512i lanes = _mm512_setr_epi32(28, 29, 30, 31, 0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11);
  return _mm512_alignr_epi8(v, _mm512_permutex2var_epi32(v, lanes, prev), 16 - N);
}

// The lookup tables and constants of the AVX-512 check, loaded once per call.
struct avx512_consts {
  __m512i byte1_high, byte1_low, byte2_high, nibble, open_at_end;
};

// Error bits for the 64 bytes v, given the bytes 1, 2 and 3 before each.
ZUL_AVX512 inline __m512i errors_avx512(const avx512_consts& k, __m512i v, __m512i prev1,
                                        __m512i prev2, __m512i prev3) {
  const __m512i special = _mm512_ternarylogic_epi32(
      _mm512_shuffle_epi8(k.byte1_high, _mm512_and_si512(_mm512_srli_epi16(prev1, 4), k.nibble)),
      _mm512_shuffle_epi8(k.byte1_low, _mm512_and_si512(prev1, k.nibble)),
      _mm512_shuffle_epi8(k.byte2_high, _mm512_and_si512(_mm512_srli_epi16(v, 4), k.nibble)),
      0x80);  // a & b & c
  const __m512i third = _mm512_subs_epu8(prev2, _mm512_set1_epi8(0x60));
  const __m512i fourth = _mm512_subs_epu8(prev3, _mm512_set1_epi8(0x70));
  // (third | fourth) & 0x80: the bytes that must be continuations.
  const __m512i must23 =
      _mm512_ternarylogic_epi32(third, fourth, _mm512_set1_epi8(static_cast<char>(0x80)), 0xA8);
  return _mm512_xor_si512(must23, special);
}

// Error bits for the 64 bytes v at offset at of in (at >= 3).
ZUL_AVX512 inline __m512i check_at_avx512(const avx512_consts& k, const std::uint8_t* in, __m512i v,
                                          std::size_t at) {
  return errors_avx512(k, v, _mm512_loadu_si512(in + at - 1), _mm512_loadu_si512(in + at - 2),
                       _mm512_loadu_si512(in + at - 3));
}

ZUL_AVX512 std::size_t copy_valid_avx512(const std::uint8_t* in, std::size_t n,
                                         std::uint8_t* out) noexcept {
  const avx512_consts k{_mm512_load_si512(kByte1HighX4.bytes), _mm512_load_si512(kByte1LowX4.bytes),
                        _mm512_load_si512(kByte2HighX4.bytes), _mm512_set1_epi8(0x0F),
                        _mm512_load_si512(kOpenAtEnd64.bytes)};
  if (n < 64) return 0;
  // The first block: the bytes before it count as ASCII.
  __m512i v = _mm512_loadu_si512(in);
  const __m512i zero = _mm512_setzero_si512();
  __m512i error = errors_avx512(k, v, prev_avx512<1>(v, zero), prev_avx512<2>(v, zero),
                                prev_avx512<3>(v, zero));
  __m512i open = _mm512_subs_epu8(v, k.open_at_end);
  if (_mm512_test_epi8_mask(error, error) != 0) return 0;
  if (out != nullptr) _mm512_storeu_si512(out, v);
  // Later blocks read the bytes before them again from memory: unaligned
  // loads are cheaper than the lane shuffles that would rebuild them. Pairs
  // of blocks first, with one test for both; the single blocks below find
  // the faulty one of a pair, and take the last block.
  std::size_t i = 64;
  for (; i + 128 <= n; i += 128) {
    const __m512i v0 = _mm512_loadu_si512(in + i);
    const __m512i v1 = _mm512_loadu_si512(in + i + 64);
    if (_mm512_movepi8_mask(_mm512_or_si512(v0, v1)) != 0) {
      error = _mm512_or_si512(check_at_avx512(k, in, v0, i), check_at_avx512(k, in, v1, i + 64));
      if (_mm512_test_epi8_mask(error, error) != 0) break;
      open = _mm512_subs_epu8(v1, k.open_at_end);
    } else if (_mm512_test_epi8_mask(open, open) != 0) {
      break;
    }
    if (out != nullptr) {
      _mm512_storeu_si512(out + i, v0);
      _mm512_storeu_si512(out + i + 64, v1);
    }
  }
  for (; i + 64 <= n; i += 64) {
    v = _mm512_loadu_si512(in + i);
    error = open;
    if (_mm512_movepi8_mask(v) != 0) {
      // The check covers a sequence left open by the block before.
      error = check_at_avx512(k, in, v, i);
      open = _mm512_subs_epu8(v, k.open_at_end);
    }
    if (_mm512_test_epi8_mask(error, error) != 0) break;
    if (out != nullptr) _mm512_storeu_si512(out + i, v);
  }
  return utf8_boundary_before(in, i);
}

// ---- Keep masks: which bytes lie inside a well-formed sequence ----
//
// The masks of one block, from its bytes and the next three after each:
// sequence starts by length, from plain comparisons of the rules of each
// first byte. A byte is kept when a sequence starting at it or up to three
// bytes before it covers it.
struct start_masks {
  std::uint64_t ascii, start2, start3, start4;
};

// The keep mask of a block from its start masks and those of the block
// before, whose last three starts may reach into this one.
inline std::uint64_t keep_from(const start_masks& s, const start_masks& before) {
  const std::uint64_t any = s.start2 | s.start3 | s.start4;
  const std::uint64_t any_before = before.start2 | before.start3 | before.start4;
  const std::uint64_t long3 = s.start3 | s.start4;
  const std::uint64_t long3_before = before.start3 | before.start4;
  return s.ascii | any | (any << 1 | any_before >> 63) | (long3 << 2 | long3_before >> 62) |
         (s.start4 << 3 | before.start4 >> 61);
}

// Bytes past the block that a sequence starting in its last three covers.
inline std::size_t overhang(const start_masks& last) {
  const auto at = [](std::uint64_t m, int k) { return ((m >> k) & 1) != 0; };
  if (at(last.start4, 63)) return 3;
  if (at(last.start3, 63) || at(last.start4, 62)) return 2;
  if (at(last.start2, 63) || at(last.start3, 62) || at(last.start4, 61)) return 1;
  return 0;
}

// AVX2: 32 bytes at a time; unsigned comparisons through min and max.
ZUL_AVX2 inline std::uint32_t mask_avx2(__m256i m) {
  return static_cast<std::uint32_t>(_mm256_movemask_epi8(m));
}

ZUL_AVX2 inline __m256i splat_avx2(int b) { return _mm256_set1_epi8(static_cast<char>(b)); }
// FF where x is 80..BF.
ZUL_AVX2 inline __m256i is_cont_avx2(__m256i x) {
  return _mm256_cmpeq_epi8(_mm256_and_si256(x, splat_avx2(0xC0)), splat_avx2(0x80));
}
// FF where x <= b and where x >= b, unsigned.
ZUL_AVX2 inline __m256i at_most_avx2(__m256i x, int b) {
  return _mm256_cmpeq_epi8(_mm256_min_epu8(x, splat_avx2(b)), x);
}
ZUL_AVX2 inline __m256i at_least_avx2(__m256i x, int b) {
  return _mm256_cmpeq_epi8(_mm256_max_epu8(x, splat_avx2(b)), x);
}

ZUL_AVX2 start_masks starts_avx2_half(const std::uint8_t* in) {
  const __m256i c = load(in);
  const __m256i d = load(in + 1);
  const __m256i cont1 = is_cont_avx2(d);
  const __m256i cont2 = is_cont_avx2(load(in + 2));
  const __m256i cont3 = is_cont_avx2(load(in + 3));
  const __m256i is_e0 = _mm256_cmpeq_epi8(c, splat_avx2(0xE0));
  const __m256i is_ed = _mm256_cmpeq_epi8(c, splat_avx2(0xED));
  const __m256i is_f0 = _mm256_cmpeq_epi8(c, splat_avx2(0xF0));
  const __m256i is_f4 = _mm256_cmpeq_epi8(c, splat_avx2(0xF4));
  // Second bytes narrower than 80..BF: E0 A0.., ED ..9F, F0 90.., F4 ..8F.
  const __m256i narrow =
      _mm256_or_si256(_mm256_or_si256(_mm256_andnot_si256(at_least_avx2(d, 0xA0), is_e0),
                                      _mm256_andnot_si256(at_most_avx2(d, 0x9F), is_ed)),
                      _mm256_or_si256(_mm256_andnot_si256(at_least_avx2(d, 0x90), is_f0),
                                      _mm256_andnot_si256(at_most_avx2(d, 0x8F), is_f4)));
  const __m256i second = _mm256_andnot_si256(narrow, cont1);
  const __m256i second2 = _mm256_and_si256(second, cont2);
  const __m256i lead2 = at_most_avx2(_mm256_sub_epi8(c, splat_avx2(0xC2)), 0x1D);
  const __m256i lead3 = at_most_avx2(_mm256_sub_epi8(c, splat_avx2(0xE0)), 0x0F);
  const __m256i lead4 = at_most_avx2(_mm256_sub_epi8(c, splat_avx2(0xF0)), 0x04);
  return {~mask_avx2(c) & 0xFFFFFFFFull, mask_avx2(_mm256_and_si256(lead2, second)),
          mask_avx2(_mm256_and_si256(lead3, second2)),
          mask_avx2(_mm256_and_si256(lead4, _mm256_and_si256(second2, cont3)))};
}

ZUL_AVX2 std::size_t keep_masks_avx2(const std::uint8_t* in, std::size_t blocks,
                                     std::uint64_t* keep) noexcept {
  start_masks before{};
  for (std::size_t b = 0; b < blocks; ++b) {
    const start_masks low = starts_avx2_half(in + 64 * b);
    const start_masks high = starts_avx2_half(in + 64 * b + 32);
    const start_masks s{low.ascii | high.ascii << 32, low.start2 | high.start2 << 32,
                        low.start3 | high.start3 << 32, low.start4 | high.start4 << 32};
    keep[b] = keep_from(s, before);
    before = s;
  }
  return overhang(before);
}

ZUL_AVX512 inline __m512i splat_avx512(int b) { return _mm512_set1_epi8(static_cast<char>(b)); }
// Bits set where x is 80..BF.
ZUL_AVX512 inline __mmask64 is_cont_avx512(__m512i x) {
  return _mm512_cmpeq_epi8_mask(_mm512_and_si512(x, splat_avx512(0xC0)), splat_avx512(0x80));
}
// Bits set where x - low is at most span, unsigned: x in low..low + span.
ZUL_AVX512 inline __mmask64 in_range_avx512(__m512i x, int low, int span) {
  return _mm512_cmple_epu8_mask(_mm512_sub_epi8(x, splat_avx512(low)), splat_avx512(span));
}

ZUL_AVX512 start_masks starts_avx512(const std::uint8_t* in) {
  const __m512i c = _mm512_loadu_si512(in);
  const __m512i d = _mm512_loadu_si512(in + 1);
  const __mmask64 cont1 = is_cont_avx512(d);
  const __mmask64 cont2 = is_cont_avx512(_mm512_loadu_si512(in + 2));
  const __mmask64 cont3 = is_cont_avx512(_mm512_loadu_si512(in + 3));
  // Second bytes narrower than 80..BF: E0 A0.., ED ..9F, F0 90.., F4 ..8F.
  const __mmask64 narrow = (_mm512_cmpeq_epi8_mask(c, splat_avx512(0xE0)) &
                            _mm512_cmplt_epu8_mask(d, splat_avx512(0xA0))) |
                           (_mm512_cmpeq_epi8_mask(c, splat_avx512(0xED)) &
                            _mm512_cmpgt_epu8_mask(d, splat_avx512(0x9F))) |
                           (_mm512_cmpeq_epi8_mask(c, splat_avx512(0xF0)) &
                            _mm512_cmplt_epu8_mask(d, splat_avx512(0x90))) |
                           (_mm512_cmpeq_epi8_mask(c, splat_avx512(0xF4)) &
                            _mm512_cmpgt_epu8_mask(d, splat_avx512(0x8F)));
  const std::uint64_t second = cont1 & ~narrow;
  return {~static_cast<std::uint64_t>(_mm512_movepi8_mask(c)),
          in_range_avx512(c, 0xC2, 0x1D) & second, in_range_avx512(c, 0xE0, 0x0F) & second & cont2,
          in_range_avx512(c, 0xF0, 0x04) & second & cont2 & cont3};
}

ZUL_AVX512 std::size_t keep_masks_avx512(const std::uint8_t* in, std::size_t blocks,
                                         std::uint64_t* keep) noexcept {
  start_masks before{};
  for (std::size_t b = 0; b < blocks; ++b) {
    const start_masks s = starts_avx512(in + 64 * b);
    keep[b] = keep_from(s, before);
    before = s;
  }
  return overhang(before);
}

}  // namespace

const utf8_kernels kUtf8Sse2{copy_valid_sse2, nullptr, 16};
const utf8_kernels kUtf8Avx2{copy_valid_avx2, keep_masks_avx2, 32};
const utf8_kernels kUtf8Avx512{copy_valid_avx512, keep_masks_avx512, 64};

}  // namespace zul::simd::detail

#endif  // x86-64
