// "Find the next byte that needs work" for the encoders and decoders: the
// byte-set search kernels of one instruction-set level. Workers take the
// level's kernels as a parameter that defaults to the machine's best, so
// tests and benchmarks can run every level on the same input.
#pragma once

#include <cstddef>
#include <cstdint>

#include "common/byte_set.h"
#include "common/cpu.h"

namespace zul {

using scan_kernels = simd::detail::byte_set_kernels;

// The byte-set search of this machine's best level.
inline const scan_kernels& machine_scan() noexcept {
  return simd::kernels_for(simd::detail::byte_set_tables(), simd::best_isa());
}

// The byte-set search of one level (the best the family has at or below it).
inline const scan_kernels& scan_for(simd::isa level) noexcept {
  return simd::kernels_for(simd::detail::byte_set_tables(), level);
}

// A byte set from a predicate over byte values, at compile time.
template <class Pred>
constexpr simd::byte_set byte_set_where(Pred pred) {
  simd::byte_set set;
  for (unsigned b = 0; b < 256; ++b) {
    if (pred(static_cast<std::uint8_t>(b))) set.add(static_cast<std::uint8_t>(b));
  }
  return set;
}

}  // namespace zul
