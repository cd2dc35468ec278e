// Hexadecimal digits shared by every family: upper case on output (RFC 3986
// section 2.1, RFC 2045 section 6.7, the hex text and hex dumps); on input
// "0"-"9", "A"-"F" and "a"-"f". Immutable tables only.
#pragma once

#include <array>
#include <cstdint>

namespace zul {

// The digit for each value 0..15.
inline constexpr char kHexDigits[] = "0123456789ABCDEF";

// For each byte: its digit value 0..15, or 0xFF when it is not a hex digit.
inline constexpr std::array<std::uint8_t, 256> kHexValues = [] {
  std::array<std::uint8_t, 256> values{};
  for (auto& v : values) v = 0xFF;
  for (int d = 0; d < 10; ++d) values['0' + d] = static_cast<std::uint8_t>(d);
  for (int d = 0; d < 6; ++d) {
    values['A' + d] = static_cast<std::uint8_t>(10 + d);
    values['a' + d] = static_cast<std::uint8_t>(10 + d);
  }
  return values;
}();

// For each byte: its digit value 0..15, or 0 when it is not a hex digit (the
// hex and percent decoders' reading of a malformed digit).
inline constexpr std::array<std::uint8_t, 256> kHexValuesOrZero = [] {
  std::array<std::uint8_t, 256> values{};
  for (std::size_t b = 0; b < 256; ++b) values[b] = kHexValues[b] == 0xFF ? 0 : kHexValues[b];
  return values;
}();

// True when c is a hex digit.
inline bool is_hex_digit(char c) { return kHexValues[static_cast<std::uint8_t>(c)] != 0xFF; }

// The digit value of c, or 0 when c is not a hex digit.
inline std::uint8_t hex_value(char c) { return kHexValuesOrZero[static_cast<std::uint8_t>(c)]; }

}  // namespace zul
