// Hex kernels: each encodes or decodes a whole buffer and hands its tail to
// the scalar path. One table per instruction-set level, chosen once per
// process; tests and benchmarks run every level the machine has.
#pragma once

#include <cstddef>
#include <cstdint>

#include "common/dispatch.h"

namespace zul::binary::detail {

struct hex_kernels {
  // Writes the 2 * n upper-case digits of in[0..n) to out.
  void (*encode)(const std::uint8_t* in, std::size_t n, char* out) noexcept;
  // Writes n bytes to out, byte k from the digit pair in[2k], in[2k + 1]
  // (a non-digit counts 0); reads 2 * n characters.
  void (*decode)(const char* in, std::size_t n, std::uint8_t* out) noexcept;
  // Writes each byte of in[0..n) as its two digits and then spacer: 3 * n
  // characters, and may write one more (out needs 3 * n + 1 of room).
  void (*spaced_pairs)(const std::uint8_t* in, std::size_t n, char spacer, char* out) noexcept;
};

const simd::family_tables<hex_kernels>& hex_tables() noexcept;

void encode_hex_scalar(const std::uint8_t* in, std::size_t n, char* out) noexcept;
void decode_hex_scalar(const char* in, std::size_t n, std::uint8_t* out) noexcept;
void encode_hex_sse2(const std::uint8_t* in, std::size_t n, char* out) noexcept;
void decode_hex_sse2(const char* in, std::size_t n, std::uint8_t* out) noexcept;
void spaced_pairs_scalar(const std::uint8_t* in, std::size_t n, char spacer, char* out) noexcept;
void spaced_pairs_avx2(const std::uint8_t* in, std::size_t n, char spacer, char* out) noexcept;
void encode_hex_avx2(const std::uint8_t* in, std::size_t n, char* out) noexcept;
void decode_hex_avx2(const char* in, std::size_t n, std::uint8_t* out) noexcept;
void encode_hex_avx512(const std::uint8_t* in, std::size_t n, char* out) noexcept;
void decode_hex_avx512(const char* in, std::size_t n, std::uint8_t* out) noexcept;
void encode_hex_neon(const std::uint8_t* in, std::size_t n, char* out) noexcept;
void decode_hex_neon(const char* in, std::size_t n, std::uint8_t* out) noexcept;

}  // namespace zul::binary::detail
