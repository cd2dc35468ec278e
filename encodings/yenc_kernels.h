// yEnc decoding kernels: each decodes a whole buffer and returns the number
// of bytes written (never more than the input's). One table per level,
// chosen once per process; the AVX-512 kernel needs VBMI2 and is absent
// from the table on machines without it (the AVX2 kernel serves them).
#pragma once

#include <cstddef>
#include <cstdint>

#include "common/dispatch.h"

namespace zul::encodings::detail {

struct yenc_kernels {
  std::size_t (*decode)(const std::uint8_t* in, std::size_t n, std::uint8_t* out) noexcept;
};

const simd::family_tables<yenc_kernels>& yenc_tables() noexcept;

std::size_t decode_yenc_scalar(const std::uint8_t* in, std::size_t n, std::uint8_t* out) noexcept;
std::size_t decode_yenc_ssse3(const std::uint8_t* in, std::size_t n, std::uint8_t* out) noexcept;
std::size_t decode_yenc_avx2(const std::uint8_t* in, std::size_t n, std::uint8_t* out) noexcept;
std::size_t decode_yenc_avx512_vbmi2(const std::uint8_t* in, std::size_t n,
                                     std::uint8_t* out) noexcept;
std::size_t decode_yenc_neon(const std::uint8_t* in, std::size_t n, std::uint8_t* out) noexcept;

}  // namespace zul::encodings::detail
