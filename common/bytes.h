// Views of raw bytes shared by every family: the workers take bytes in as
// a span of unsigned bytes and never see the host.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

namespace zul {

using bytes_view = std::span<const std::uint8_t>;

// The bytes of a string view, as unsigned bytes.
inline bytes_view bytes_of(std::string_view s) noexcept {
  return {reinterpret_cast<const std::uint8_t*>(s.data()), s.size()};
}

}  // namespace zul
