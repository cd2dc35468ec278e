// Doubles as ASCII text, the same on every platform: exponent notation with a
// chosen number of decimals (the C "%.Ne" conversion) and a plain positional
// text cut to about fifteen significant characters. Digits come from the
// exact decimal value of the double, rounded half to even where a conversion
// rounds (the correctly rounded output C99 7.19.6.1 recommends, which exact C
// libraries print, and which std::to_chars with a precision always gives).
// Special values read inf, -inf and nan (never -nan). No heap allocation.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace zul::text {

// A formatted number: size characters in chars, never more than 499. The
// characters past size are not initialised.
struct number_text {
  std::array<char, 500> chars;
  std::size_t size = 0;
  std::string_view view() const { return {chars.data(), size}; }
};

// d as "%.Ne" with N = digits taken as a signed 32-bit value (a negative N
// counts as 6): one digit, a point and N decimals (no point for N = 0), "e",
// the exponent's sign and at least two exponent digits. The text is cut
// after 498 characters, so very large N gives no exponent part.
number_text format_scientific(double d, std::int64_t digits) noexcept;

// d in positional notation: the "%.99f" text cut to fifteen characters from
// its first significant one (the minus sign counts; zeros before the point
// do not), rounded up when the next digit of the "%.99f" text is 5 or more,
// with a trailing run of zeros after the point kept as a single 0: 0.1 ->
// "0.10", 2.0 -> "2.0", 1.0/3 -> "0.333333333333333", 1000000.1 ->
// "1000000.099999999976717". When more than fourteen characters before the
// point are not 0, the text ends at the point, rounded by the first decimal
// (123456789012345680.0 -> "123456789012345680"). inf, -inf and nan are
// returned as they are.
number_text format_plain(double d) noexcept;

}  // namespace zul::text
