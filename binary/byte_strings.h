// Byte strings built without regard to text: the concatenation of several
// strings, a pattern repeated to an exact byte length, and random bytes or
// random 7-bit characters. Results are raw bytes; a multi-byte character may
// be cut where a repetition ends.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <span>
#include <string>

#include "common/size_gate.h"

namespace zul::binary {

// The parts' bytes one after another, nothing between them; "" when all are
// empty, and "" without allocating when the total would pass limit bytes.
std::string concat_bytes(std::span<const std::span<const std::uint8_t>> parts,
                         std::uint64_t limit = kMaxResultBytes);

// length bytes of pattern repeated from its start, the last copy cut at the
// length; length zero bytes when pattern is empty.
std::string repeat_to_length(std::span<const std::uint8_t> pattern, std::size_t length);

// length bytes, one call of next() each, in order. With ascii, byte 0x20 +
// (r mod 96) for the value r, so 0x20..0x7F (0x7F included); otherwise the
// low eight bits of r. next must return non-negative values, like rand().
template <class Next>
std::string random_bytes(std::size_t length, bool ascii, Next&& next) {
  std::string out(length, '\0');
  for (char& c : out) {
    const auto r = static_cast<unsigned>(next());
    c = static_cast<char>(ascii ? 0x20 + r % 96 : r & 0xFF);
  }
  return out;
}

// random_bytes from the C library's process-wide generator (std::rand).
inline std::string random_bytes(std::size_t length, bool ascii) {
  return random_bytes(length, ascii, [] { return std::rand(); });
}

}  // namespace zul::binary
