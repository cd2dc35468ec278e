// Hex dumps: the upper-case hex digits of raw bytes cut into groups of
// hexlen characters, linelen groups a line, each line opened and closed by
// caller texts and its groups separated by a spacer. Every line, the last
// included, holds linelen whole groups: the digits are followed by as many
// copies of the filler text as the last line needs, cut into pieces without
// regard to where one copy ends.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

#include "binary/hex_kernels.h"
#include "common/cpu.h"
#include "common/out_buffer.h"
#include "common/size_gate.h"

namespace zul::binary {

struct hex_dump_layout {
  std::int64_t hexlen = 2;     // group size in hex characters (2 = one byte)
  std::int64_t linelen = 16;   // groups per line
  std::string_view linestart;  // written before every line
  std::string_view lineend;    // written after every line, the last one too
  std::string_view spacer;     // written between two groups of one line
  std::string_view filler;     // completes the last line; "" means "0"
};

// Results longer than this are never built (the host's string length limit).
inline constexpr std::uint64_t kMaxDumpLength = kMaxResultBytes;

// The dump of input: ceil(2n / (linelen * hexlen)) lines. Empty input, a
// hexlen or linelen below 1, or a dump longer than kMaxDumpLength give ""
// without allocating anything of that size (sizes are checked for overflow).
// kernels: the hex encoder to use (tests pass every level's).
out_buffer hex_dump(std::span<const std::uint8_t> input, const hex_dump_layout& layout,
                    const detail::hex_kernels& kernels = simd::kernels_for(detail::hex_tables(),
                                                                           simd::best_isa()));

namespace detail {

// The dump's length in characters, or 0 when it is empty or would exceed
// kMaxDumpLength.
std::uint64_t hex_dump_length(std::uint64_t input_size, const hex_dump_layout& layout);

}  // namespace detail
}  // namespace zul::binary
