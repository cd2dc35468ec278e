// Hex dumps through the whole digit text: all digits first, then the filler
// the last line needs, then the lines copied out group by group. The
// reference for binary/hex_dump.h.
#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "binary/hex_dump.h"

namespace zul::reference {

std::string hex_dump_reference(std::span<const std::uint8_t> input,
                               const binary::hex_dump_layout& layout);

}  // namespace zul::reference
