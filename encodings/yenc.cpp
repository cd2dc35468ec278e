// yEnc decoding: runs between "=" escapes are a plain subtraction of 42,
// which the compiler vectorises; escapes are handled one at a time. One
// output buffer of the input's size, trimmed at the end.
#include "encodings/yenc.h"

#include <cstdint>
#include <cstring>

namespace zul::encodings {

std::string decode_yenc(std::string_view in) {
  const std::size_t n = in.size();
  std::string out(n, '\0');
  auto* o = reinterpret_cast<std::uint8_t*>(out.data());
  const auto* p = reinterpret_cast<const std::uint8_t*>(in.data());
  std::size_t i = 0;
  while (i < n) {
    const void* eq = std::memchr(p + i, '=', n - i);
    const std::size_t run =
        eq ? static_cast<std::size_t>(static_cast<const std::uint8_t*>(eq) - p) - i : n - i;
    for (std::size_t k = 0; k < run; ++k) o[k] = static_cast<std::uint8_t>(p[i + k] - 42);
    o += run;
    i += run;
    if (i == n) break;
    const std::uint8_t escaped = i + 1 < n ? p[i + 1] : 0;
    *o++ = static_cast<std::uint8_t>(escaped - 64 - 42);
    i += 2;
  }
  out.resize(static_cast<std::size_t>(o - reinterpret_cast<std::uint8_t*>(out.data())));
  return out;
}

}  // namespace zul::encodings
