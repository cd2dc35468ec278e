// yEnc decoding runs the machine's kernel (AVX-512 VBMI2 compress in
// encodings/yenc_x86.cpp, table-driven packing for SSSE3 and AVX2 in
// yenc_pack_x86.cpp and for NEON in yenc_neon.cpp). The scalar path, fallback and tail: runs
// between "=" escapes are a plain subtraction of 42, which the compiler vectorises; escapes are
// handled one at a time. One output buffer of the input's size, reserved and never zero-filled; the
// result is the part written.
#include "encodings/yenc.h"

#include <atomic>
#include <cstdint>
#include <cstring>

#include "common/cpu.h"
#include "encodings/yenc_kernels.h"

namespace zul::encodings {
namespace detail {

std::size_t decode_yenc_scalar(const std::uint8_t* p, std::size_t n, std::uint8_t* out) noexcept {
  std::uint8_t* o = out;
  std::size_t i = 0;
  while (i < n) {
    const void* eq = std::memchr(p + i, '=', n - i);
    const std::size_t run =
        eq ? static_cast<std::size_t>(static_cast<const std::uint8_t*>(eq) - p) - i : n - i;
    for (std::size_t k = 0; k < run; ++k) o[k] = static_cast<std::uint8_t>(p[i + k] - 42);
    o += run;
    i += run;
    if (i == n) break;
    const std::uint8_t escaped = i + 1 < n ? p[i + 1] : 0;
    *o++ = static_cast<std::uint8_t>(escaped - 64 - 42);
    i += 2;
  }
  return static_cast<std::size_t>(o - out);
}

namespace {
constexpr yenc_kernels kScalar{decode_yenc_scalar};
#if defined(__x86_64__) || defined(_M_X64)
constexpr yenc_kernels kSsse3{decode_yenc_ssse3};
constexpr yenc_kernels kAvx2{decode_yenc_avx2};
constexpr yenc_kernels kVbmi2{decode_yenc_avx512_vbmi2};
#elif defined(__aarch64__)
constexpr yenc_kernels kNeon{decode_yenc_neon};
#endif
std::atomic<const yenc_kernels*> active_kernels{nullptr};
}  // namespace

const simd::family_tables<yenc_kernels>& yenc_tables() noexcept {
  // Built once: whether the AVX-512 level has a kernel depends on VBMI2.
  static const simd::family_tables<yenc_kernels> tables = [] {
    simd::family_tables<yenc_kernels> t;
    t.scalar = &kScalar;
#if defined(__x86_64__) || defined(_M_X64)
    t.ssse3 = &kSsse3;
    t.avx2 = &kAvx2;
    if (simd::has_avx512_vbmi2()) t.avx512 = &kVbmi2;
#elif defined(__aarch64__)
    t.neon = &kNeon;
#endif
    return t;
  }();
  return tables;
}

}  // namespace detail

out_buffer decode_yenc(std::string_view in) {
  out_buffer out(in.size());
  std::uint8_t* o = out.tail();
  out.commit(simd::active(detail::yenc_tables(), detail::active_kernels)
                 .decode(reinterpret_cast<const std::uint8_t*>(in.data()), in.size(), o));
  return out;
}

}  // namespace zul::encodings
