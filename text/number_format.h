// Doubles as ASCII text, the same on every platform: exponent notation with a
// chosen number of decimals (the C "%.Ne" conversion) and a plain positional
// text cut to about fifteen significant characters. Digits come from the
// exact decimal value of the double, rounded half to even where a conversion
// rounds (the correctly rounded output C99 7.19.6.1 recommends, which exact C
// libraries print). Special values read inf, -inf and nan (never -nan). No
// heap allocation.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace zul::text {

// A formatted number: size characters in chars, never more than 499.
struct number_text {
  std::array<char, 500> chars{};
  std::size_t size = 0;
  std::string_view view() const { return {chars.data(), size}; }
};

// d as "%.Ne" with N = digits taken as a signed 32-bit value (a negative N
// counts as 6): one digit, a point and N decimals (no point for N = 0), "e",
// the exponent's sign and at least two exponent digits. The text is cut
// after 498 characters, so very large N gives no exponent part.
number_text format_scientific(double d, std::int64_t digits) noexcept;

// d in positional notation, cut to about fifteen significant characters and
// rounded at the cut, with a trailing run of zeros after the point kept as a
// single 0: 0.1 -> "0.10", 2.0 -> "2.0", 1.0/3 -> "0.333333333333333",
// 1000000.1 -> "1000000.099999999976717", 123456789012345680.0 ->
// "123456789012345680" (more than fourteen significant integer characters:
// no fraction). inf, -inf and nan are returned as they are.
number_text format_plain(double d) noexcept;

namespace detail {
// d as "%.Nf" (N from 0 to 400), cut after limit characters (at most 499).
number_text format_fixed(double d, int precision, std::size_t limit = 499) noexcept;
}  // namespace detail

}  // namespace zul::text
