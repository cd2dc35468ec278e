// One byte at a time, written for clarity, not speed.
#include "tests/reference/char_class_reference.h"

namespace zul::reference {

bool all_bytes_in_reference(bytes_view bytes, text::byte_class cls) {
  if (bytes.empty()) return false;
  for (const std::uint8_t c : bytes) {
    const bool in = cls == text::byte_class::seven_bit   ? c <= 0x7F
                    : cls == text::byte_class::printable ? c >= 0x20 && c <= 0x7F
                                                         : c >= 0x20;
    if (!in) return false;
  }
  return true;
}

}  // namespace zul::reference
