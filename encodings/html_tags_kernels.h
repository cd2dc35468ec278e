// Block kernels of tag removal without a replacement: whole blocks of bytes
// are filtered at once (bytes at depth 0 kept, brackets and zero bytes
// dropped) and the byte-at-a-time loop of html_tags.cpp finishes the tail.
// AVX-512 with VBMI and VBMI2 compresses the kept bytes of any block (a
// byte permute gives the depth's running sum); SSE2 and AVX2 copy the
// runs between brackets.
#pragma once

#include <cstddef>
#include <cstdint>

#include "common/cpu.h"
#include "common/dispatch.h"

namespace zul::encodings::detail {

struct tag_kernels {
  // Filters whole blocks of in[0, n) into out, starting at *depth and
  // leaving the depth after them there; out must have room for n bytes.
  // Returns the bytes consumed; *written is the bytes written. Null where
  // the level has no block kernel.
  std::size_t (*strip_tags)(const std::uint8_t* in, std::size_t n, std::uint8_t* out,
                            std::int64_t* depth, std::size_t* written) noexcept;
};

const simd::family_tables<tag_kernels>& tag_tables() noexcept;

extern const tag_kernels kStripTagsSse2, kStripTagsAvx2;
std::size_t strip_tags_avx512_vbmi2(const std::uint8_t* in, std::size_t n, std::uint8_t* out,
                                    std::int64_t* depth, std::size_t* written) noexcept;

}  // namespace zul::encodings::detail
