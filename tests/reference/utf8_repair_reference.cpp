// The rows of the Unicode Standard's Table 3-7 as plain comparisons, one
// position at a time, written for clarity, not speed.
#include "tests/reference/utf8_repair_reference.h"

#include <cstdint>

namespace zul::reference {
namespace {

bool in(std::uint8_t c, std::uint8_t low, std::uint8_t high) { return c >= low && c <= high; }

}  // namespace

std::size_t well_formed_length_reference(bytes_view b) {
  if (b.empty()) return 0;
  const std::uint8_t c = b[0];
  std::size_t length;
  std::uint8_t low = 0x80, high = 0xBF;  // range of the second byte
  if (c <= 0x7F) return 1;
  if (in(c, 0xC2, 0xDF)) {
    length = 2;
  } else if (in(c, 0xE0, 0xEF)) {
    length = 3;
    if (c == 0xE0) low = 0xA0;
    if (c == 0xED) high = 0x9F;
  } else if (in(c, 0xF0, 0xF4)) {
    length = 4;
    if (c == 0xF0) low = 0x90;
    if (c == 0xF4) high = 0x8F;
  } else {
    return 0;  // 80..C1 and F5..FF begin nothing
  }
  if (b.size() < length || !in(b[1], low, high)) return 0;
  for (std::size_t k = 2; k < length; ++k) {
    if (!in(b[k], 0x80, 0xBF)) return 0;
  }
  return length;
}

std::string repair_utf8_reference(bytes_view bytes, std::string_view placeholder) {
  std::string out;
  std::size_t i = 0;
  while (i < bytes.size()) {
    const std::size_t length = well_formed_length_reference(bytes.subspan(i));
    if (length == 0) {
      out.append(placeholder);
      ++i;
    } else {
      out.append(reinterpret_cast<const char*>(bytes.data() + i), length);
      i += length;
    }
  }
  return out;
}

}  // namespace zul::reference
