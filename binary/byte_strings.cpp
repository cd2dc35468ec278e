// Concatenation sizes the result once from the parts' lengths. Repetition
// copies the pattern once and then doubles the filled prefix with memcpy, so
// a long result from a short pattern costs about log2(length) copies rather
// than one per repetition.
#include "binary/byte_strings.h"

#include <algorithm>
#include <cstring>

namespace zul::binary {

std::string concat_bytes(std::span<const std::span<const std::uint8_t>> parts,
                         std::uint64_t limit) {
  result_size total(limit);
  for (const auto& part : parts) total.add(part.size());
  if (!total.fits()) return {};
  std::string out(total.bytes(), '\0');
  char* p = out.data();
  for (const auto& part : parts) {
    if (part.empty()) continue;
    std::memcpy(p, part.data(), part.size());
    p += part.size();
  }
  return out;
}

std::string repeat_to_length(std::span<const std::uint8_t> pattern, std::size_t length) {
  std::string out(length, '\0');
  if (pattern.empty() || length == 0) return out;
  std::size_t filled = std::min(pattern.size(), length);
  std::memcpy(out.data(), pattern.data(), filled);
  // out[0, filled) holds whole copies of the pattern (or the cut first one),
  // so appending a copy of it keeps every byte at its place in the repetition.
  while (filled < length) {
    const std::size_t chunk = std::min(filled, length - filled);
    std::memcpy(out.data() + filled, out.data(), chunk);
    filled += chunk;
  }
  return out;
}

}  // namespace zul::binary
