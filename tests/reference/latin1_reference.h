// Single-byte encoding by a plain table search, unit by unit: the reference
// for the reverse maps and fast paths of text/latin1.h.
#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "text/latin1.h"

namespace zul::reference {

// The lowest byte whose table entry equals unit, or -1 when none does.
int search_table_reference(const text::charset_table& table, std::uint16_t unit);

// One byte per unit that the table holds (units it does not hold dropped).
std::string encode_single_byte_reference(std::span<const std::uint16_t> units,
                                         const text::charset_table& table);

}  // namespace zul::reference
