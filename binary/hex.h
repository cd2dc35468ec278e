// Hexadecimal text of raw bytes and back: two upper-case digits per byte,
// high nibble first, no separators. Decoding takes characters strictly in
// pairs from the start and never resynchronises: any character that is not
// a digit (0-9, A-F, a-f) counts as 0, and an odd final character is ignored.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

#include "common/out_buffer.h"

namespace zul::binary {

// 2 * bytes.size() upper-case digits; "" for no bytes. The result is written
// once into a buffer of its exact size. Throws std::bad_alloc.
out_buffer encode_hex(std::span<const std::uint8_t> bytes);

// text.size() / 2 bytes, each from the digit pair at 2k, 2k + 1 (non-digits
// count 0); "" when text has fewer than two characters.
out_buffer decode_hex(std::string_view text);

}  // namespace zul::binary
