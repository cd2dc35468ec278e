// UTF-8 well-formedness: the table of well-formed byte sequences of the
// Unicode Standard (Table 3-7: no overlong forms, no surrogates D800..DFFF,
// nothing above 10FFFF; the zero byte is an ordinary one-byte sequence), as a
// scalar scan and as vector kernels that prove whole blocks well formed with
// the published lookup-table method ("Validating UTF-8 in less than one
// instruction per byte", 2021), copying each block as they go.
#pragma once

#include <cstddef>
#include <cstdint>

#include "common/dispatch.h"
#include "common/utf8.h"

namespace zul {

// Advances from offset i of p[0, n) over whole well-formed sequences while
// the offset is below limit (limit <= n). Returns where it stopped: at or
// past limit (up to 3 bytes past it) when everything from i was well formed,
// otherwise the offset of the first byte that begins no well-formed sequence
// (a sequence cut short by n included). Skips ASCII 16 bytes at a time.
std::size_t utf8_scan(const std::uint8_t* p, std::size_t i, std::size_t n,
                      std::size_t limit) noexcept;

}  // namespace zul

namespace zul::simd {

struct utf8_kernels {
  // Length of a prefix of in[0, n) made of whole well-formed sequences: the
  // scalar kernel finds the longest; vector kernels prove whole blocks and
  // may stop up to one block plus 3 bytes short of it (the caller finishes
  // with utf8_scan). When out is not null the prefix is copied there; the
  // kernel may write up to n bytes to out.
  std::size_t (*copy_valid)(const std::uint8_t* in, std::size_t n, std::uint8_t* out) noexcept;
  // For text dense with faulty bytes (null where the level has none): bit k
  // of keep[b] tells whether byte 64 * b + k of in lies inside a well-formed
  // sequence, for each of the given number of 64-byte blocks; in must hold
  // 64 * blocks + 3 bytes and no sequence from before in may reach into it.
  // Returns how many bytes past the last block the last sequence covers
  // (0..3).
  std::size_t (*keep_masks)(const std::uint8_t* in, std::size_t blocks,
                            std::uint64_t* keep) noexcept;
  // Bytes that copy_valid proves at a time (1 for the scalar kernel).
  std::size_t block;
};

// Every level's table, for tests and benchmarks.
const family_tables<utf8_kernels>& utf8_tables() noexcept;
// The table for this machine, chosen at first use.
const utf8_kernels& utf8_active() noexcept;

namespace detail {
// The block kernels of x86-64 and of arm64 (each defined on its own
// architecture only).
extern const utf8_kernels kUtf8Sse2, kUtf8Avx2, kUtf8Avx512, kUtf8Neon;
// The boundary at or before offset end of in: end, moved back over a
// sequence that begins before end and would end after it. Every sequence
// before end must already be known well formed.
std::size_t utf8_boundary_before(const std::uint8_t* in, std::size_t end) noexcept;
}  // namespace detail

}  // namespace zul::simd
