// Byte-class tests and the printable filter. Long inputs search for the
// first byte outside the class with the byte-set kernels; short ones read
// eight bytes per step and use two classic word tricks: a byte has its high
// bit set when (w & 0x80..80) is non-zero, and some byte is below 0x20
// exactly when (w - 0x20..20) & ~w & 0x80..80 is non-zero (a borrow can
// only start at a byte below 0x20, and a byte of 0x80 or more never sets its
// own flag).
#include "text/char_class.h"

#include <cstring>

#include "common/byte_set.h"
#include "text/char_class_kernels.h"

namespace zul::text {
namespace {

constexpr std::uint64_t kOnes = 0x0101010101010101ull;
constexpr std::uint64_t kHigh = 0x8080808080808080ull;

constexpr bool byte_in(std::uint8_t c, byte_class cls) {
  switch (cls) {
    case byte_class::seven_bit:
      return c <= 0x7F;
    case byte_class::printable:
      return c >= 0x20 && c <= 0x7F;
    case byte_class::non_control:
      return c >= 0x20;
  }
  return false;
}

bool word_in(std::uint64_t w, byte_class cls) {
  const bool high = (w & kHigh) != 0;
  const bool control = ((w - 0x20 * kOnes) & ~w & kHigh) != 0;
  switch (cls) {
    case byte_class::seven_bit:
      return !high;
    case byte_class::printable:
      return !high && !control;
    case byte_class::non_control:
      return !control;
  }
  return false;
}

bool all_bytes_in_words(std::span<const std::uint8_t> bytes, byte_class cls) {
  std::size_t i = 0;
  for (; i + 8 <= bytes.size(); i += 8) {
    std::uint64_t w;
    std::memcpy(&w, bytes.data() + i, 8);
    if (!word_in(w, cls)) return false;
  }
  for (; i < bytes.size(); ++i) {
    if (!byte_in(bytes[i], cls)) return false;
  }
  return true;
}

// The bytes outside each class, prepared once at compile time.
constexpr simd::byte_set complement(byte_class cls) {
  simd::byte_set out;
  for (unsigned b = 0; b < 256; ++b) {
    if (!byte_in(static_cast<std::uint8_t>(b), cls)) out.add(static_cast<std::uint8_t>(b));
  }
  return out;
}
constexpr simd::byte_set kOutside[] = {complement(byte_class::seven_bit),
                                       complement(byte_class::printable),
                                       complement(byte_class::non_control)};

const simd::byte_set& outside(byte_class cls) { return kOutside[static_cast<int>(cls)]; }

}  // namespace

std::optional<byte_class> byte_class_for_mode(std::int64_t mode) noexcept {
  switch (mode) {
    case 0:
      return byte_class::seven_bit;
    case 1:
      return byte_class::printable;
    case 2:
      return byte_class::non_control;
    default:
      return std::nullopt;
  }
}

bool all_bytes_in(std::span<const std::uint8_t> bytes, byte_class cls) noexcept {
  if (bytes.empty()) return false;
  // Short inputs: the word loop costs less than a kernel call.
  if (bytes.size() < 32) return all_bytes_in_words(bytes, cls);
  return simd::find_first_in_set(outside(cls), bytes) == bytes.size();
}

out_buffer replace_non_printable(std::span<const std::uint8_t> bytes, std::uint8_t replacement) {
  out_buffer out(bytes.size());
  detail::active_char_class_kernels().replace_non_printable(bytes.data(), bytes.size(), replacement,
                                                            out.extend(bytes.size()));
  return out;
}

}  // namespace zul::text
