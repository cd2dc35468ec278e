// CPU feature detection. x86-64: CPUID leaf 1 and 7 for the instruction
// sets, XGETBV for the register state the OS saves (SSE, AVX, opmask and
// ZMM); AVX-512 here means F, BW, VL and DQ together. arm64: NEON is part
// of the architecture. Results are computed once per process.
#include "common/cpu.h"

#include <array>

#if defined(__x86_64__) || defined(_M_X64)
#if defined(_MSC_VER) && !defined(__clang__)
#include <intrin.h>
#else
#include <cpuid.h>
#endif
#endif

namespace zul::simd {
namespace {

struct features {
  bool ssse3 = false;
  bool avx2 = false;
  bool avx512 = false;
  bool vbmi2 = false;
};

#if defined(__x86_64__) || defined(_M_X64)
void cpuid(unsigned leaf, unsigned sub, unsigned r[4]) noexcept {
#if defined(_MSC_VER) && !defined(__clang__)
  int v[4];
  __cpuidex(v, static_cast<int>(leaf), static_cast<int>(sub));
  for (int i = 0; i < 4; ++i) r[i] = static_cast<unsigned>(v[i]);
#else
  __cpuid_count(leaf, sub, r[0], r[1], r[2], r[3]);
#endif
}

std::uint64_t xgetbv0() noexcept {
  std::uint32_t lo = 0, hi = 0;
  __asm__ volatile("xgetbv" : "=a"(lo), "=d"(hi) : "c"(0));
  return (static_cast<std::uint64_t>(hi) << 32) | lo;
}

features detect() noexcept {
  features f;
  unsigned r[4];
  cpuid(0, 0, r);
  const unsigned max_leaf = r[0];
  if (max_leaf < 1) return f;
  cpuid(1, 0, r);
  f.ssse3 = (r[2] >> 9) & 1;
  if (max_leaf < 7) return f;
  const bool osxsave = (r[2] >> 27) & 1;
  const bool avx = (r[2] >> 28) & 1;
  const bool fma = (r[2] >> 12) & 1;
  if (!osxsave || !avx) return f;
  const std::uint64_t xcr0 = xgetbv0();
  const bool ymm_state = (xcr0 & 0x6) == 0x6;    // SSE and AVX state
  const bool zmm_state = (xcr0 & 0xE6) == 0xE6;  // plus opmask, ZMM0-15 upper, ZMM16-31
  cpuid(7, 0, r);
  const unsigned b = r[1], c = r[2];
  const bool avx2 = (b >> 5) & 1, bmi1 = (b >> 3) & 1, bmi2 = (b >> 8) & 1;
  f.avx2 = ymm_state && avx2 && bmi1 && bmi2 && fma;
  const bool avx512f = (b >> 16) & 1, avx512dq = (b >> 17) & 1, avx512bw = (b >> 30) & 1,
             avx512vl = (b >> 31) & 1;
  f.avx512 = f.avx2 && zmm_state && avx512f && avx512dq && avx512bw && avx512vl;
  const bool vbmi = (c >> 1) & 1, vbmi2 = (c >> 6) & 1;
  f.vbmi2 = f.avx512 && vbmi && vbmi2;
  return f;
}
#endif

struct levels {
  std::array<isa, 5> list{};
  std::uint8_t count = 0;
  bool vbmi2 = false;
};

levels compute() noexcept {
  levels l;
  l.list[l.count++] = isa::scalar;
#if defined(__x86_64__) || defined(_M_X64)
  const features f = detect();
  l.list[l.count++] = isa::sse2;
  if (f.ssse3) l.list[l.count++] = isa::ssse3;
  if (f.avx2) l.list[l.count++] = isa::avx2;
  if (f.avx512) l.list[l.count++] = isa::avx512;
  l.vbmi2 = f.vbmi2;
#elif defined(__aarch64__) || defined(_M_ARM64)
  l.list[l.count++] = isa::neon;
#endif
  return l;
}

// Computed on first use; C++ guarantees one initialisation even when
// several host threads arrive at once, and later reads take no lock.
const levels& get() noexcept {
  static const levels computed = compute();
  return computed;
}

}  // namespace

const char* isa_name(isa level) noexcept {
  switch (level) {
    case isa::scalar:
      return "scalar";
    case isa::sse2:
      return "sse2";
    case isa::ssse3:
      return "ssse3";
    case isa::avx2:
      return "avx2";
    case isa::avx512:
      return "avx512";
    case isa::neon:
      return "neon";
  }
  return "?";
}

std::span<const isa> supported_isas() noexcept {
  const levels& l = get();
  return {l.list.data(), l.count};
}

isa best_isa() noexcept { return supported_isas().back(); }

bool has_avx512_vbmi2() noexcept { return get().vbmi2; }

}  // namespace zul::simd
