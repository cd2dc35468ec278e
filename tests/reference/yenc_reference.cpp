// One byte at a time, written for clarity, not speed.
#include "tests/reference/yenc_reference.h"

#include <cstdint>

namespace zul::reference {

std::string decode_yenc_reference(std::string_view in) {
  std::string out;
  out.reserve(in.size());
  for (std::size_t i = 0; i < in.size();) {
    auto b = static_cast<std::uint8_t>(in[i++]);
    if (b == '=') {
      b = i < in.size() ? static_cast<std::uint8_t>(in[i]) : 0;
      ++i;
      b = static_cast<std::uint8_t>(b - 64);
    }
    out += static_cast<char>(static_cast<std::uint8_t>(b - 42));
  }
  return out;
}

}  // namespace zul::reference
