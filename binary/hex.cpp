// Hex encoding and decoding run the machine's hex kernels (byte shuffles in
// binary/hex_kernels_x86.cpp, SSE2 arithmetic in hex_kernels_sse2.cpp). The
// scalar path, their fallback and tail, turns four bytes at a time into
// eight digits inside one 64-bit word (SWAR), finishing through a 256-entry
// table of digit pairs; it decodes through the shared value table in which
// every non-digit is 0.
#include "binary/hex.h"

#include <array>
#include <atomic>
#include <bit>
#include <cstring>

#include "binary/hex_kernels.h"
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

namespace detail {

void encode_hex_scalar(const std::uint8_t* in, std::size_t n, char* out) noexcept {
  static_assert(std::endian::native == std::endian::little, "digit lanes assume little-endian");
  std::size_t i = 0;
  for (; i + 4 <= n; i += 4, out += 8) {
    const std::uint64_t eight = digits_of_four(in + i);
    std::memcpy(out, &eight, 8);
  }
  for (; i < n; ++i, out += 2) std::memcpy(out, kDigitPairs[in[i]].data(), 2);
}

// One 4-byte store a byte: its digit pair and the spacer; the next store
// starts on the fourth byte.
void spaced_pairs_scalar(const std::uint8_t* in, std::size_t n, char spacer, char* out) noexcept {
  const std::uint32_t space = static_cast<std::uint32_t>(static_cast<std::uint8_t>(spacer)) << 16;
  for (std::size_t k = 0; k < n; ++k, out += 3) {
    std::uint16_t pair;
    std::memcpy(&pair, kDigitPairs[in[k]].data(), 2);
    const std::uint32_t three = pair | space;
    std::memcpy(out, &three, 4);
  }
}

void decode_hex_scalar(const char* in, std::size_t n, std::uint8_t* out) noexcept {
  for (std::size_t k = 0; k < n; ++k, in += 2) {
    out[k] = static_cast<std::uint8_t>(hex_value(in[0]) << 4 | hex_value(in[1]));
  }
}

namespace {
constexpr hex_kernels kScalar{encode_hex_scalar, decode_hex_scalar, spaced_pairs_scalar};
#if defined(__x86_64__) || defined(_M_X64)
constexpr hex_kernels kSse2{encode_hex_sse2, decode_hex_sse2, spaced_pairs_scalar};
constexpr hex_kernels kAvx2{encode_hex_avx2, decode_hex_avx2, spaced_pairs_avx2};
constexpr hex_kernels kAvx512{encode_hex_avx512, decode_hex_avx512, spaced_pairs_avx2};
constexpr simd::family_tables<hex_kernels> kTables{&kScalar, &kSse2, &kAvx2, &kAvx512, nullptr};
#elif defined(__aarch64__)
constexpr hex_kernels kNeon{encode_hex_neon, decode_hex_neon, spaced_pairs_scalar};
constexpr simd::family_tables<hex_kernels> kTables{&kScalar, nullptr, nullptr, nullptr, &kNeon};
#else
constexpr simd::family_tables<hex_kernels> kTables{&kScalar};
#endif
std::atomic<const hex_kernels*> active_kernels{nullptr};
}  // namespace

const simd::family_tables<hex_kernels>& hex_tables() noexcept { return kTables; }

}  // namespace detail

out_buffer encode_hex(std::span<const std::uint8_t> bytes) {
  out_buffer out(2 * bytes.size());
  char* digits = reinterpret_cast<char*>(out.extend(2 * bytes.size()));
  simd::active(detail::hex_tables(), detail::active_kernels)
      .encode(bytes.data(), bytes.size(), digits);
  return out;
}

out_buffer decode_hex(std::string_view text) {
  const std::size_t n = text.size() / 2;
  out_buffer out(n);
  simd::active(detail::hex_tables(), detail::active_kernels).decode(text.data(), n, out.extend(n));
  return out;
}

}  // namespace zul::binary
