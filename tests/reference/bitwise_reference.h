// Byte-at-a-time AND / OR / XOR of data with a repeating mask: the reference
// for the word-at-a-time paths of binary/bitwise.h.
#pragma once

#include <cstdint>
#include <string>

#include "binary/bitwise.h"
#include "common/bytes.h"

namespace zul::reference {

// out[i] = data[i] op mask[(start + i) mod m] for every i; m >= 1 and
// start < m.
std::string combine_reference(binary::detail::bit_op op, bytes_view data, bytes_view mask,
                              std::size_t start);

}  // namespace zul::reference
