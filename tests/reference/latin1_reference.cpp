// One unit and one table entry at a time, written for clarity, not speed.
#include "tests/reference/latin1_reference.h"

namespace zul::reference {

int search_table_reference(const text::charset_table& table, std::uint16_t unit) {
  for (int k = 0; k < 256; ++k) {
    if (table[k] == unit) return k;
  }
  return -1;
}

std::string encode_single_byte_reference(std::span<const std::uint16_t> units,
                                         const text::charset_table& table) {
  std::string out;
  for (const std::uint16_t unit : units) {
    const int b = search_table_reference(table, unit);
    if (b >= 0) out += static_cast<char>(b);
  }
  return out;
}

}  // namespace zul::reference
