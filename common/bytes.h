// Views of raw bytes shared by every family: the workers take bytes in as
// a span of unsigned bytes and never see the host.
#pragma once

#include <cstdint>
#include <cstring>
#include <span>
#include <string_view>

namespace zul {

using bytes_view = std::span<const std::uint8_t>;

// The bytes of a string view, as unsigned bytes.
inline bytes_view bytes_of(std::string_view s) noexcept {
  return {reinterpret_cast<const std::uint8_t*>(s.data()), s.size()};
}

// True when every byte is below 0x80 (no bytes included); eight bytes a step.
inline bool all_ascii(bytes_view bytes) noexcept {
  const std::uint8_t* p = bytes.data();
  std::size_t n = bytes.size();
  std::uint64_t seen = 0;
  for (; n >= 8; p += 8, n -= 8) {
    std::uint64_t word;
    std::memcpy(&word, p, 8);
    seen |= word;
  }
  for (; n > 0; ++p, --n) seen |= *p;
  return (seen & 0x8080808080808080ull) == 0;
}

}  // namespace zul
