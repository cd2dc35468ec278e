// One byte at a time through the digit table, written for clarity.
#include "tests/reference/hex_reference.h"

#include "common/hex_digits.h"

namespace zul::reference {

std::string encode_hex_reference(bytes_view bytes) {
  std::string out;
  for (const std::uint8_t b : bytes) {
    out += kHexDigits[b >> 4];
    out += kHexDigits[b & 0x0F];
  }
  return out;
}

}  // namespace zul::reference
