// Byte-at-a-time hex text: the reference for the word-at-a-time encoder of
// binary/hex.h.
#pragma once

#include <string>

#include "common/bytes.h"

namespace zul::reference {

// Two upper-case digits per byte, high nibble first.
std::string encode_hex_reference(bytes_view bytes);

}  // namespace zul::reference
