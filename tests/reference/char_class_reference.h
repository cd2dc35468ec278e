// Byte classes tested one byte at a time: the reference for the eight-byte
// steps of text/char_class.h.
#pragma once

#include "common/bytes.h"
#include "text/char_class.h"

namespace zul::reference {

// True when bytes holds at least one byte and every byte is in the class.
bool all_bytes_in_reference(bytes_view bytes, text::byte_class cls);

}  // namespace zul::reference
