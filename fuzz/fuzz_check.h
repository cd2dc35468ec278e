// Shared by the fuzz targets: a failed invariant aborts, so that libFuzzer
// and the replay driver both report it with the input that broke it.
#pragma once

#include <cstdint>
#include <cstdlib>
#include <span>
#include <string_view>

namespace zul_fuzz {

inline void check(bool ok) {
  if (!ok) std::abort();
}

// The bytes of a string, for the workers that take byte spans.
inline std::span<const std::uint8_t> bytes_of(std::string_view s) {
  return {reinterpret_cast<const std::uint8_t*>(s.data()), s.size()};
}

}  // namespace zul_fuzz
