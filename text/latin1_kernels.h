// Block kernels for the single-byte character sets, one table per
// instruction-set level. Both sets map the bytes 00..7F and A0..FF to the
// units of the same value, so blocks of those move as they are (widened or
// narrowed); only the bytes 80..9F and units outside those ranges take a
// table look-up, one lane at a time.
#pragma once

#include <cstddef>
#include <cstdint>

#include "common/dispatch.h"

namespace zul::text {

struct single_byte_charset;

struct single_byte_kernels {
  // Decodes whole blocks of in[0, n) into out, one unit per byte; c1 holds
  // the units of the bytes 80..9F, or is null when they decode to their own
  // values. Returns how many bytes were decoded; the caller does the rest.
  std::size_t (*decode)(const std::uint8_t* in, std::size_t n, std::uint16_t* out,
                        const std::uint16_t* c1) noexcept;
  // Encodes whole blocks of in[0, n) into out, one byte per unit that the
  // set holds (byte_for_unit), dropping the others. out must have room for
  // n bytes. Returns the units consumed; *written is the bytes written.
  std::size_t (*encode)(const std::uint16_t* in, std::size_t n, std::uint8_t* out,
                        const single_byte_charset& set, std::size_t* written) noexcept;
};

// Every level's table, for tests and benchmarks; active for this machine.
const simd::family_tables<single_byte_kernels>& single_byte_tables() noexcept;
const single_byte_kernels& single_byte_active() noexcept;

namespace detail {
extern const single_byte_kernels kSingleByteSse2, kSingleByteAvx2, kSingleByteAvx512;
// The AVX-512 decoder with an encoder that needs VBMI and VBMI2.
extern const single_byte_kernels kSingleByteAvx512Vbmi2;
// The arm64 kernels.
extern const single_byte_kernels kSingleByteNeon;
}  // namespace detail

}  // namespace zul::text
