// Number formatting on std::to_chars with a precision, whose digits are the
// exact decimal value of the double rounded half to even (as both libstdc++
// and libc++ implement it). The plain text needs only the
// digits up to its cut, not all 99 decimals: see fraction_decimals. Integer
// parts of 2^64 and more come from integer_digits, twice as fast as
// std::to_chars on them.
#include "text/number_format.h"

#include <algorithm>
#include <bit>
#include <charconv>
#include <cmath>

#include "text/integer_digits.h"

namespace zul::text {
namespace {

// inf, -inf and nan written to text; false for finite values.
bool put_special(number_text& text, double d) {
  std::string_view s;
  if (std::isnan(d)) {
    s = "nan";  // the sign of a NaN is not shown
  } else if (std::isinf(d)) {
    s = d < 0 ? "-inf" : "inf";
  } else {
    return false;
  }
  text.size = s.copy(text.chars.data(), s.size());
  return true;
}

// True when the positive double f is a multiple of 10^-q, that is when its
// binary expansion m * 2^e (m odd) has at most q places after the point.
bool has_at_most_decimals(double f, int q) {
  const auto bits = std::bit_cast<std::uint64_t>(f);
  const int biased = static_cast<int>((bits >> 52) & 0x7FF);
  std::uint64_t m = bits & ((std::uint64_t{1} << 52) - 1);
  int e = -1074;
  if (biased != 0) {
    m |= std::uint64_t{1} << 52;
    e = biased - 1075;
  }
  e += std::countr_zero(m);
  return -e <= q;
}

// The significant digits kept plus the digit that decides the rounding, and
// the guard digits beyond them that show whether the "%.99f" text could
// differ from the exact value's digits there.
constexpr int kGuard = 3;

// Writes the first decimals of f (0 < f < 1) as "%.99f" prints them and
// returns how many: all 99, or at least up to the count-th digit from the
// first one that is not 0. No digit that is not 0 means the fraction is
// zero at 99 decimals.
//
// The fast way asks for count + kGuard significant digits, rounded at the
// last one (decimal q). Up to the count-th they are the digits of the "%.99f"
// text (rounded at decimal 99 >= q) unless a rounding carry could reach
// them: that needs the exact guard digits to be all 9, which shows as guard
// digits all 9 or all 0 (after a carry). Such rare values, and those with
// q beyond 99, take all 99 decimals instead.
int fraction_decimals(double f, int count, char* out) {
  if (f < 4e-100) return 0;  // below 5e-100, which rounds to zero at 99 decimals
  if (f >= 1e-80) {
    char sci[48];  // d.<count + kGuard - 1 digits>e-XX
    const int precision = count + kGuard - 1;
    const char* end =
        std::to_chars(sci, sci + sizeof sci, f, std::chars_format::scientific, precision).ptr;
    const char* e = std::find(static_cast<const char*>(sci), end, 'e');
    int exponent = 0;
    std::from_chars(e + 1, end, exponent);
    const int leading = -exponent - 1;  // zeros after the point
    const int q = leading + 1 + precision;
    const std::string_view guard(e - kGuard, kGuard);
    const bool clear = guard.find_first_not_of('0') != std::string_view::npos &&
                       guard.find_first_not_of('9') != std::string_view::npos;
    if (q <= 99 && (clear || has_at_most_decimals(f, q))) {
      std::fill_n(out, leading, '0');
      out[leading] = sci[0];
      std::copy_n(sci + 2, count - 1, out + leading + 1);
      return leading + count;
    }
  }
  char fixed[104];  // "0." and 99 decimals
  std::to_chars(fixed, fixed + sizeof fixed, f, std::chars_format::fixed, 99);
  std::copy_n(fixed + 2, 99, out);
  return 99;
}

// Adds one unit in the last place of the text t[0, len), carrying leftwards
// over the point; a carry past the first digit inserts a 1 in front of it
// (after a minus sign) and moves the rest up by one (t has room for it).
void round_up(char* t, std::size_t& len) {
  std::ptrdiff_t i = static_cast<std::ptrdiff_t>(len) - 1;
  for (; i >= 0 && t[i] != '-'; --i) {
    if (t[i] == '.') continue;
    if (t[i] != '9') break;
    t[i] = '0';
  }
  if (i >= 0 && t[i] != '-') {
    ++t[i];
    return;
  }
  const auto at = static_cast<std::size_t>(i + 1);
  std::copy_backward(t + at, t + len, t + len + 1);
  t[at] = '1';
  ++len;
}

// Writes the integer part of a non-negative double, digit for digit.
char* put_integer(char* p, double whole) {
  if (whole < 0x1p64) return std::to_chars(p, p + 320, static_cast<std::uint64_t>(whole)).ptr;
  return detail::put_large_integer(p, whole);
}

}  // namespace

number_text format_scientific(double d, std::int64_t digits) noexcept {
  number_text text;
  if (put_special(text, d)) return text;
  // The precision is read as a C int; a negative one means the default, 6.
  // A double has at most 767 significant digits, so beyond 800 decimals only
  // zeros follow, and the text is cut long before: 800 shows the same text.
  std::int32_t precision = static_cast<std::int32_t>(digits);
  if (precision < 0) precision = 6;
  char* const out = text.chars.data();
  if (precision <= 400) {  // at most 409 characters: straight into the text
    const char* end =
        std::to_chars(out, out + text.chars.size(), d, std::chars_format::scientific, precision)
            .ptr;
    text.size = std::min<std::size_t>(static_cast<std::size_t>(end - out), 498);
    return text;
  }
  char buffer[816];  // -d.<800 digits>e+308
  const char* end = std::to_chars(buffer, buffer + sizeof buffer, d, std::chars_format::scientific,
                                  std::min(precision, 800))
                        .ptr;
  text.size = std::min<std::size_t>(static_cast<std::size_t>(end - buffer), 498);
  std::copy_n(buffer, text.size, out);
  return text;
}

// The "%.99f" text is never built. Its integer part is that of d (99
// decimals cannot round a double's fraction up to 1), and the cut needs its
// decimals only up to fifteen characters from the first significant one,
// plus one for the rounding.
number_text format_plain(double d) noexcept {
  number_text out;
  if (put_special(out, d)) return out;
  const double magnitude = std::fabs(d);
  const double whole = std::trunc(magnitude);
  const double fraction = magnitude - whole;  // exact

  char* const t = out.chars.data();  // at most 410 characters, room for a carry
  char* p = t;
  if (std::signbit(d)) *p++ = '-';
  p = put_integer(p, whole);
  // k, the characters before the point other than 0, matters only up to 15.
  int k = 0;
  for (const char* c = t; c < p && k <= 14; ++c) k += *c != '0' ? 1 : 0;
  std::size_t len = static_cast<std::size_t>(p - t);
  if (k > 14) {  // no fraction; its first decimal is 5 or more from 0.5 on
    if (fraction >= 0.5) round_up(t, len);
  } else {
    *p++ = '.';
    // A fraction that is not 0 means a whole part below 2^53: the 99
    // decimals fit behind it, where they are written directly.
    char* const decimals = p;
    const int n = fraction == 0 ? 0 : fraction_decimals(fraction, 16 - k, decimals);
    const int first = static_cast<int>(
        std::find_if(decimals, decimals + n, [](char c) { return c != '0'; }) - decimals);
    if (first == n) {  // zero at 99 decimals
      decimals[0] = '0';
      len = static_cast<std::size_t>(decimals + 1 - t);
    } else {
      const int cut = first + 15 - k;  // index of the deciding digit
      len = static_cast<std::size_t>(decimals + std::min(cut, n) - t);
      if (cut < n && decimals[cut] >= '5') round_up(t, len);
      while (t[len - 1] == '0' && t[len - 2] == '0') --len;
    }
  }
  out.size = len;
  return out;
}

}  // namespace zul::text
