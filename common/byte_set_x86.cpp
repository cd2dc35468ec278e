// Byte-set search kernels for x86-64, compiled per function for SSSE3, AVX2
// and AVX-512 (BW) so the rest of the library stays at the SSE2 baseline.
//
// Membership of byte v in one shuffle round (exact for any set):
//   row = shuffle(low_rows, v) | shuffle(high_rows, v ^ 0x80)
//     the byte shuffle uses the low nibble of each index and yields 0 when
//     the index has bit 7 set, so exactly one of the two terms is the row of
//     v's low nibble in the half (0x00..0x7F or 0x80..0xFF) that holds v;
//   bit = shuffle({1, 2, 4, ..., 128, 1, 2, ...}, v >> 4)   (1 << (hi & 7))
//   v is a member when row & bit != 0.
// Blocks run two vectors at a time; the end is one overlapping vector (no
// earlier byte matched, so re-reading them is harmless) or, for AVX-512, a
// masked load that never touches bytes past the end.
//
// Code-point lanes are first narrowed to bytes with unsigned saturation
// (min(c, 255)), then take the same membership test: AVX2 clamps with
// vpminud and packs twice (vpackusdw, vpackuswb, which interleave the 128-bit
// halves; one vpermd puts the dwords back in order), AVX-512 narrows 16 lanes
// at a time with vpmovusdb.
#include "common/byte_set.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"

namespace zul::simd::detail {
namespace {

struct tables128 {
  __m128i low, high, bits, nibble, top;
};

ZUL_SSSE3 inline tables128 load_tables128(const byte_set& set) {
  return {_mm_load_si128(reinterpret_cast<const __m128i*>(set.low_rows())),
          _mm_load_si128(reinterpret_cast<const __m128i*>(set.high_rows())),
          _mm_setr_epi8(1, 2, 4, 8, 16, 32, 64, -128, 1, 2, 4, 8, 16, 32, 64, -128),
          _mm_set1_epi8(0x0F), _mm_set1_epi8(static_cast<char>(0x80))};
}

// 0xFF in each lane whose byte is a member.
ZUL_SSSE3 inline __m128i members128(const tables128& t, __m128i v) {
  const __m128i row =
      _mm_or_si128(_mm_shuffle_epi8(t.low, v), _mm_shuffle_epi8(t.high, _mm_xor_si128(v, t.top)));
  const __m128i bit = _mm_shuffle_epi8(t.bits, _mm_and_si128(_mm_srli_epi16(v, 4), t.nibble));
  return _mm_cmpeq_epi8(_mm_and_si128(row, bit), bit);
}

ZUL_SSSE3 inline unsigned mask128(const tables128& t, const std::uint8_t* p) {
  const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
  return static_cast<unsigned>(_mm_movemask_epi8(members128(t, v)));
}

struct tables256 {
  __m256i low, high, bits, nibble, top;
};

ZUL_AVX2 inline tables256 load_tables256(const byte_set& set) {
  const __m128i low = _mm_load_si128(reinterpret_cast<const __m128i*>(set.low_rows()));
  const __m128i high = _mm_load_si128(reinterpret_cast<const __m128i*>(set.high_rows()));
  const __m128i bits = _mm_setr_epi8(1, 2, 4, 8, 16, 32, 64, -128, 1, 2, 4, 8, 16, 32, 64, -128);
  return {_mm256_broadcastsi128_si256(low), _mm256_broadcastsi128_si256(high),
          _mm256_broadcastsi128_si256(bits), _mm256_set1_epi8(0x0F),
          _mm256_set1_epi8(static_cast<char>(0x80))};
}

// 0xFF in each lane whose byte is a member.
ZUL_AVX2 inline __m256i members256(const tables256& t, __m256i v) {
  const __m256i row = _mm256_or_si256(_mm256_shuffle_epi8(t.low, v),
                                      _mm256_shuffle_epi8(t.high, _mm256_xor_si256(v, t.top)));
  const __m256i hi = _mm256_and_si256(_mm256_srli_epi16(v, 4), t.nibble);
  const __m256i bit = _mm256_shuffle_epi8(t.bits, hi);
  return _mm256_cmpeq_epi8(_mm256_and_si256(row, bit), bit);
}

ZUL_AVX2 inline std::uint32_t mask256(const tables256& t, const std::uint8_t* p) {
  const __m256i v = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p));
  return static_cast<std::uint32_t>(_mm256_movemask_epi8(members256(t, v)));
}

struct tables512 {
  __m512i low, high, bits, nibble, top;
};

// The masked form: GCC 12 flags the plain broadcast's undefined source under
// -Wuninitialized.
ZUL_AVX512 inline __m512i broadcast512(__m128i v) {
  return _mm512_maskz_broadcast_i32x4(static_cast<__mmask16>(0xFFFF), v);
}

ZUL_AVX512 inline tables512 load_tables512(const byte_set& set) {
  const __m128i low = _mm_load_si128(reinterpret_cast<const __m128i*>(set.low_rows()));
  const __m128i high = _mm_load_si128(reinterpret_cast<const __m128i*>(set.high_rows()));
  const __m128i bits = _mm_setr_epi8(1, 2, 4, 8, 16, 32, 64, -128, 1, 2, 4, 8, 16, 32, 64, -128);
  return {broadcast512(low), broadcast512(high), broadcast512(bits), _mm512_set1_epi8(0x0F),
          _mm512_set1_epi8(static_cast<char>(0x80))};
}

ZUL_AVX512 inline __mmask64 members512(const tables512& t, __m512i v) {
  const __m512i row = _mm512_or_si512(_mm512_shuffle_epi8(t.low, v),
                                      _mm512_shuffle_epi8(t.high, _mm512_xor_si512(v, t.top)));
  const __m512i hi = _mm512_and_si512(_mm512_srli_epi16(v, 4), t.nibble);
  return _mm512_test_epi8_mask(row, _mm512_shuffle_epi8(t.bits, hi));
}

}  // namespace

ZUL_SSSE3 std::size_t find_first_in_set_ssse3(const byte_set& set, const std::uint8_t* p,
                                              std::size_t n) noexcept {
  if (n < 16) return find_first_in_set_scalar(set, p, n);
  const tables128 t = load_tables128(set);
  std::size_t i = 0;
  for (; n - i >= 32; i += 32) {
    const __m128i a = members128(t, _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i)));
    const __m128i b = members128(t, _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i + 16)));
    if (_mm_movemask_epi8(_mm_or_si128(a, b)) != 0) {
      const unsigned m = static_cast<unsigned>(_mm_movemask_epi8(a)) |
                         static_cast<unsigned>(_mm_movemask_epi8(b)) << 16;
      return i + static_cast<std::size_t>(__builtin_ctz(m));
    }
  }
  if (n - i >= 16) {
    if (const unsigned m = mask128(t, p + i)) return i + __builtin_ctz(m);
    i += 16;
  }
  if (i == n) return n;
  const unsigned m = mask128(t, p + n - 16);
  return m ? n - 16 + __builtin_ctz(m) : n;
}

ZUL_AVX2 std::size_t find_first_in_set_avx2(const byte_set& set, const std::uint8_t* p,
                                            std::size_t n) noexcept {
  if (n < 32) return find_first_in_set_scalar(set, p, n);
  const tables256 t = load_tables256(set);
  std::size_t i = 0;
  for (; n - i >= 64; i += 64) {
    const __m256i a = members256(t, _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p + i)));
    const __m256i b =
        members256(t, _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p + i + 32)));
    if (!_mm256_testz_si256(_mm256_or_si256(a, b), _mm256_or_si256(a, b))) {
      const std::uint64_t m = static_cast<std::uint32_t>(_mm256_movemask_epi8(a)) |
                              static_cast<std::uint64_t>(_mm256_movemask_epi8(b)) << 32;
      return i + static_cast<std::size_t>(__builtin_ctzll(m));
    }
  }
  if (n - i >= 32) {
    if (const std::uint32_t m = mask256(t, p + i)) return i + __builtin_ctz(m);
    i += 32;
  }
  if (i == n) return n;
  const std::uint32_t m = mask256(t, p + n - 32);
  return m ? n - 32 + __builtin_ctz(m) : n;
}

ZUL_AVX512 std::size_t find_first_in_set_avx512(const byte_set& set, const std::uint8_t* p,
                                                std::size_t n) noexcept {
  std::size_t i = 0;
  // The first 64 bytes in 32-byte halves: encoders and decoders call this
  // for every run between two bytes that need work, and on typical text
  // those runs are short.
  if (n >= 64) {
    const tables256 h = load_tables256(set);
    const auto a = static_cast<std::uint32_t>(_mm256_movemask_epi8(
        members256(h, _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p)))));
    if (a != 0) return __builtin_ctz(a);
    const auto b = static_cast<std::uint32_t>(_mm256_movemask_epi8(
        members256(h, _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p + 32)))));
    if (b != 0) return 32 + __builtin_ctz(b);
    i = 64;
  }
  const tables512 t = load_tables512(set);
  for (; n - i >= 128; i += 128) {
    const __mmask64 a = members512(t, _mm512_loadu_si512(p + i));
    const __mmask64 b = members512(t, _mm512_loadu_si512(p + i + 64));
    if ((a | b) != 0) return i + (a ? __builtin_ctzll(a) : 64 + __builtin_ctzll(b));
  }
  for (; i < n; i += 64) {
    const std::size_t left = n - i;
    const __mmask64 live =
        left >= 64 ? ~__mmask64{0} : _bzhi_u64(~0ull, static_cast<unsigned>(left));
    const __mmask64 m = members512(t, _mm512_maskz_loadu_epi8(live, p + i)) & live;
    if (m != 0) return i + __builtin_ctzll(m);
  }
  return n;
}

namespace {

// 8 code-point lanes clamped to 255.
ZUL_AVX2 inline __m256i clamped256(const std::uint32_t* p) {
  return _mm256_min_epu32(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(p)),
                          _mm256_set1_epi32(255));
}

// 32 code-point lanes as the bytes min(c, 255), in order.
ZUL_AVX2 inline __m256i narrow256(const std::uint32_t* p) {
  const __m256i ab = _mm256_packus_epi32(clamped256(p), clamped256(p + 8));
  const __m256i cd = _mm256_packus_epi32(clamped256(p + 16), clamped256(p + 24));
  return _mm256_permutevar8x32_epi32(_mm256_packus_epi16(ab, cd),
                                     _mm256_setr_epi32(0, 4, 1, 5, 2, 6, 3, 7));
}

template <bool kNarrow>
ZUL_AVX2 std::size_t code_points_avx2(const byte_set& set, const std::uint32_t* p, std::size_t n,
                                      std::uint8_t* out) noexcept {
  const tables256 t = load_tables256(set);
  std::size_t i = 0;
  for (; n - i >= 32; i += 32) {
    const __m256i v = narrow256(p + i);
    if (kNarrow) _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + i), v);
    if (const auto m = static_cast<std::uint32_t>(_mm256_movemask_epi8(members256(t, v)))) {
      return i + static_cast<std::size_t>(__builtin_ctz(m));
    }
  }
  return i + (kNarrow ? narrow_until_member_scalar(set, p + i, n - i, out + i)
                      : find_first_code_point_scalar(set, p + i, n - i));
}

// 16 lanes (those of live; the others read as 0) as bytes min(c, 255). The
// zero-masked form, as in broadcast512: GCC 12 flags the plain one's
// undefined source.
ZUL_AVX512 inline __m128i narrow128(const std::uint32_t* p, __mmask16 live) {
  return _mm512_maskz_cvtusepi32_epi8(static_cast<__mmask16>(0xFFFF),
                                      _mm512_maskz_loadu_epi32(live, p));
}

template <bool kNarrow>
ZUL_AVX512 std::size_t code_points_avx512(const byte_set& set, const std::uint32_t* p,
                                          std::size_t n, std::uint8_t* out) noexcept {
  const tables512 t = load_tables512(set);
  const __mmask16 all = 0xFFFF;
  std::size_t i = 0;
  for (; n - i >= 64; i += 64) {
    __m512i v = _mm512_zextsi128_si512(narrow128(p + i, all));
    v = _mm512_inserti32x4(v, narrow128(p + i + 16, all), 1);
    v = _mm512_inserti32x4(v, narrow128(p + i + 32, all), 2);
    v = _mm512_inserti32x4(v, narrow128(p + i + 48, all), 3);
    if (kNarrow) _mm512_storeu_si512(out + i, v);
    if (const __mmask64 m = members512(t, v)) return i + __builtin_ctzll(m);
  }
  for (; i < n; i += 16) {
    const std::size_t left = n - i;
    const auto live = static_cast<__mmask16>(left >= 16 ? 0xFFFF : (1u << left) - 1);
    const __m128i q = narrow128(p + i, live);
    if (kNarrow) _mm_storeu_si128(reinterpret_cast<__m128i*>(out + i), q);
    if (const __mmask64 m = members512(t, _mm512_zextsi128_si512(q)) & live) {
      return i + __builtin_ctzll(m);
    }
  }
  return n;
}

}  // namespace

std::size_t find_first_code_point_avx2(const byte_set& set, const std::uint32_t* p,
                                       std::size_t n) noexcept {
  return code_points_avx2<false>(set, p, n, nullptr);
}
std::size_t narrow_until_member_avx2(const byte_set& set, const std::uint32_t* p, std::size_t n,
                                     std::uint8_t* out) noexcept {
  return code_points_avx2<true>(set, p, n, out);
}
std::size_t find_first_code_point_avx512(const byte_set& set, const std::uint32_t* p,
                                         std::size_t n) noexcept {
  return code_points_avx512<false>(set, p, n, nullptr);
}
std::size_t narrow_until_member_avx512(const byte_set& set, const std::uint32_t* p, std::size_t n,
                                       std::uint8_t* out) noexcept {
  return code_points_avx512<true>(set, p, n, out);
}

}  // namespace zul::simd::detail
#endif
