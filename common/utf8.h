// The well-formedness table of UTF-8 (Unicode Standard, Table 3-7) keyed by
// the first byte of a sequence: its length and the allowed range of its
// second byte. Third and fourth bytes are always 80..BF. Immutable.
#pragma once

#include <array>
#include <cstdint>

namespace zul {

struct utf8_lead {
  std::uint8_t length;      // 1 for ASCII, 2..4 for a lead byte, 0: begins no sequence
  std::uint8_t second_low;  // allowed range of the second byte of a lead byte
  std::uint8_t second_high;
};

inline constexpr std::array<utf8_lead, 256> kUtf8Leads = [] {
  std::array<utf8_lead, 256> t{};
  for (int c = 0x00; c <= 0x7F; ++c) t[c] = {1, 0, 0};
  for (int c = 0xC2; c <= 0xDF; ++c) t[c] = {2, 0x80, 0xBF};
  t[0xE0] = {3, 0xA0, 0xBF};
  for (int c = 0xE1; c <= 0xEF; ++c) t[c] = {3, 0x80, 0xBF};
  t[0xED] = {3, 0x80, 0x9F};
  t[0xF0] = {4, 0x90, 0xBF};
  for (int c = 0xF1; c <= 0xF3; ++c) t[c] = {4, 0x80, 0xBF};
  t[0xF4] = {4, 0x80, 0x8F};
  return t;
}();

// True for 80..BF, the bytes that continue a sequence.
inline constexpr bool is_utf8_continuation(std::uint8_t b) { return (b & 0xC0) == 0x80; }

}  // namespace zul
