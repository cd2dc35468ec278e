// Instruction sets the vector kernels are written for, and the one the
// running CPU and operating system support best. Detection runs once per
// process (CPUID and XGETBV on x86-64: the OS must have enabled the YMM and
// ZMM register state); every later call is one relaxed atomic load.
#pragma once

#include <cstdint>
#include <span>

namespace zul::simd {

// Ordered from the most portable to the most capable on each architecture.
// SSSE3 adds the byte shuffle that SSE2 lacks (every x86-64 Mac has it; some
// PCs without AVX2 have it too).
enum class isa : std::uint8_t { scalar, sse2, ssse3, avx2, avx512, neon };

// Name for tests, benchmarks and zul: "scalar", "sse2", "ssse3", "avx2",
// "avx512", "neon".
const char* isa_name(isa level) noexcept;

// Every level this machine can run, scalar first and the best last.
std::span<const isa> supported_isas() noexcept;

// The best level this machine can run (the last of supported_isas()).
isa best_isa() noexcept;

// CPU features beyond the baseline of a level that single kernels may use
// (AVX-512 VBMI and VBMI2 byte permutes and compress-store).
bool has_avx512_vbmi2() noexcept;

}  // namespace zul::simd
