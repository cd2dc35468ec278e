// UTF-8 validation and repair. Well-formed means exactly the table of
// well-formed UTF-8 byte sequences of the Unicode Standard (Table 3-7): no
// overlong forms, no surrogates D800..DFFF, nothing above 10FFFF; the zero
// byte is an ordinary one-byte sequence. Repair keeps every well-formed
// sequence byte for byte and puts a placeholder in place of each byte that
// does not begin one, judging the next byte afresh.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

#include "common/out_buffer.h"
#include "common/utf8_valid.h"

namespace zul::text {

using bytes_view = std::span<const std::uint8_t>;

// Length of the longest prefix of bytes made of whole well-formed sequences:
// the offset of the first byte that begins no well-formed sequence, or
// bytes.size() when there is none.
std::size_t well_formed_prefix(bytes_view bytes) noexcept;

// bytes with each byte that begins no well-formed sequence replaced by
// placeholder (an empty placeholder drops such bytes), using the block
// kernels of the given level. The output is reserved once for the worst
// case, capped at limit; output that would pass limit bytes gives "" and the
// repair stops there. Throws std::bad_alloc when the output cannot be
// allocated.
out_buffer repair_utf8(bytes_view bytes, std::string_view placeholder,
                       std::uint64_t limit = kMaxResultBytes,
                       const simd::utf8_kernels& kernels = simd::utf8_active());

}  // namespace zul::text
