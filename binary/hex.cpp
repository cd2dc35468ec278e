// Hex encoding turns four bytes at a time into eight digits inside one 64-bit
// word (SWAR), finishing through a 256-entry table of digit pairs; decoding
// maps characters through the shared value table in which every non-digit
// is 0.
#include "binary/hex.h"

#include <array>
#include <bit>
#include <cstring>

#include "common/hex_digits.h"

namespace zul::binary {
namespace {

// The two digits of each byte value, high nibble first, in memory order.
constexpr std::array<std::array<char, 2>, 256> kDigitPairs = [] {
  std::array<std::array<char, 2>, 256> pairs{};
  for (std::size_t b = 0; b < 256; ++b) pairs[b] = {kHexDigits[b >> 4], kHexDigits[b & 0x0F]};
  return pairs;
}();

constexpr std::uint64_t kLowNibbles = 0x000F000F000F000Full;
constexpr std::uint64_t kEveryByte = 0x0101010101010101ull;

// Eight digits for the four bytes of in (memory order), in memory order.
// Each byte b is spread into a 16-bit lane as (b >> 4) | (b & 15) << 8, so
// the lane's first byte is the high nibble; then every nibble n becomes
// '0' + n, plus 7 when n >= 10 (n + 6 carries into bit 4 exactly then).
// No step carries from one byte into the next.
std::uint64_t digits_of_four(const std::uint8_t* in) {
  std::uint32_t four;
  std::memcpy(&four, in, 4);
  std::uint64_t x = four;
  x = (x | x << 16) & 0x0000FFFF0000FFFFull;
  x = (x | x << 8) & 0x00FF00FF00FF00FFull;
  const std::uint64_t n = ((x >> 4) & kLowNibbles) | (x & kLowNibbles) << 8;
  const std::uint64_t letters = ((n + 6 * kEveryByte) >> 4) & kEveryByte;
  return n + '0' * kEveryByte + 7 * letters;
}

}  // namespace

std::string encode_hex(std::span<const std::uint8_t> bytes) {
  std::string out(2 * bytes.size(), '\0');
  char* p = out.data();
  std::size_t i = 0;
  static_assert(std::endian::native == std::endian::little, "digit lanes assume little-endian");
  for (; i + 4 <= bytes.size(); i += 4, p += 8) {
    const std::uint64_t eight = digits_of_four(bytes.data() + i);
    std::memcpy(p, &eight, 8);
  }
  for (; i < bytes.size(); ++i, p += 2) std::memcpy(p, kDigitPairs[bytes[i]].data(), 2);
  return out;
}

std::string decode_hex(std::string_view text) {
  std::string out(text.size() / 2, '\0');
  const char* p = text.data();
  for (char& b : out) {
    b = static_cast<char>(hex_value(p[0]) << 4 | hex_value(p[1]));
    p += 2;
  }
  return out;
}

}  // namespace zul::binary
