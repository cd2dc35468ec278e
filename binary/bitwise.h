// Bitwise combination of a data string with a repeating mask: AND, OR, XOR,
// and XOR mixed with each byte's position. The data sets the result length;
// the mask repeats from its start (or from a chosen offset for XOR) and is
// cut at the data's end. The word-at-a-time paths are tested against a
// byte-at-a-time reference kept with the tests (tests/reference/).
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

#include "common/bytes.h"
#include "common/out_buffer.h"

namespace zul::binary {

// data[i] AND mask[i mod m]. Empty data or an empty mask give "".
out_buffer and_with_mask(bytes_view data, bytes_view mask);

// data[i] OR mask[i mod m]. Empty data or an empty mask give "".
out_buffer or_with_mask(bytes_view data, bytes_view mask);

// data[i] XOR mask[(offset + i) mod m]. The offset is reduced modulo the mask
// length, floored (-1 is the last mask byte), so the mask position never
// leaves the mask. Applying it twice with the same mask and offset gives the
// data back. Empty data or an empty mask give "".
out_buffer xor_with_mask(bytes_view data, bytes_view mask, std::int64_t offset);

// As xor_with_mask, then each byte is also XORed with the low eight bits of
// its own position (0, 1, ..., 255, 0, ...). Its own inverse, too.
out_buffer xor_with_mask_and_position(bytes_view data, bytes_view mask, std::int64_t offset);

namespace detail {

enum class bit_op { kAnd, kOr, kXor };

// The mask index that meets data byte 0: offset floored modulo m (m >= 1).
std::size_t mask_start(std::int64_t offset, std::size_t m);

// The byte rule out[i] = data[i] op mask[(start + i) mod m], for i <
// data.size(), in long runs of the machine's run kernel. out has room
// for data.size() bytes and may be data.data() itself; m >= 1 and start < m.
void combine_fast(bit_op op, bytes_view data, bytes_view mask, std::size_t start,
                  std::uint8_t* out);

// out[i] ^= i & 0xFF for i < n, word-wise.
void xor_positions(std::uint8_t* out, std::size_t n);

}  // namespace detail
}  // namespace zul::binary
