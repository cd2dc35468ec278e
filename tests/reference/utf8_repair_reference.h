// UTF-8 repair judged position by position with the well-formedness table
// written out as branches: the reference for the table-driven scan of
// text/utf8_repair.h.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

#include "common/bytes.h"

namespace zul::reference {

// Length (1 to 4) of the well-formed sequence that bytes begins with, or 0
// when its first byte begins none (also when the end cuts it short or bytes
// is empty).
std::size_t well_formed_length_reference(bytes_view bytes);

// bytes with each byte that begins no well-formed sequence replaced by
// placeholder.
std::string repair_utf8_reference(bytes_view bytes, std::string_view placeholder);

}  // namespace zul::reference
