// MySQL unescaping for AVX-512 with VBMI and VBMI2, 64 bytes a block:
//   slash   = lanes holding a backslash;
//   escaped = lanes after a backslash that starts an escape (the first,
//             third, ... of a run of backslashes), found with one carrying
//             add over the run starts (the method simdjson uses for JSON
//             string escapes);
//   decoded = escaped lanes whose byte is an escape letter, through a
//             128-entry table (a two-register byte permute);
//   keep    = every lane but the backslashes before decoded lanes;
// the kept bytes, decoded ones replaced, are compressed to the front of a
// register (VPCOMPRESSB) and stored whole: the output never runs ahead of
// the input. A block whose last lane starts an escape ends before it, so the
// next block starts with the backslash and no state crosses blocks.
#include "encodings/sql_kernels.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <immintrin.h>

#include "common/targets.h"

namespace zul::encodings::detail {

ZUL_AVX512_VBMI2 std::size_t unescape_mysql_avx512_vbmi2(const std::uint8_t* in, std::size_t n,
                                                         std::uint8_t* out,
                                                         std::size_t* written) noexcept {
  // The byte each escape letter below 0x80 stands for, 0xFF for none (no
  // escape stands for 0xFF).
  alignas(64) std::uint8_t table[128];
  for (int b = 0; b < 128; ++b) {
    table[b] = kMySQLEscapes[b] == 0xFFFF ? 0xFF : static_cast<std::uint8_t>(kMySQLEscapes[b]);
  }
  const __m512i table_lo = _mm512_load_si512(table), table_hi = _mm512_load_si512(table + 64);
  const __m512i backslash = _mm512_set1_epi8('\\');
  const __m512i none = _mm512_set1_epi8(static_cast<char>(0xFF));
  constexpr std::uint64_t kEven = 0x5555555555555555u;
  std::size_t i = 0, o = 0;
  while (n - i >= 64) {
    const __m512i v = _mm512_loadu_si512(in + i);
    const std::uint64_t slash = _mm512_cmpeq_epi8_mask(v, backslash);
    if (slash == 0) {
      _mm512_storeu_si512(out + o, v);
      i += 64;
      o += 64;
      continue;
    }
    // Runs of backslashes that start on an odd lane are offset by one so
    // that adding the run starts carries out of each run at the right
    // parity; the lanes the carries land on are the escaped ones.
    const std::uint64_t follows = slash << 1;
    const std::uint64_t odd_starts = slash & ~kEven & ~follows;
    const std::uint64_t escaped = (kEven ^ ((odd_starts + slash) << 1)) & follows;
    const __m512i mapped = _mm512_permutex2var_epi8(table_lo, v, table_hi);
    const std::uint64_t decoded =
        escaped & _mm512_cmpneq_epi8_mask(mapped, none) & ~_mm512_movepi8_mask(v);
    // A backslash in the last lane that starts an escape waits for the
    // next block.
    std::uint64_t keep = ~(decoded >> 1);
    std::size_t block = 64;
    if ((slash >> 63) != 0 && (escaped >> 63) == 0) {
      keep &= ~(std::uint64_t{1} << 63);
      block = 63;
    }
    _mm512_storeu_si512(out + o,
                        _mm512_maskz_compress_epi8(keep, _mm512_mask_mov_epi8(v, decoded, mapped)));
    o += static_cast<std::size_t>(__builtin_popcountll(keep));
    i += block;
  }
  *written = o;
  return i;
}

}  // namespace zul::encodings::detail

#endif  // x86-64
