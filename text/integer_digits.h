// Exact decimal digits of large integral doubles, which std::to_chars takes
// about twice as long for as for seventeen significant digits: a double
// of 2^64 or more is m * 2^e (m below 2^53, e from 12 to 971), whose up to
// 309 digits come from one product of m * 2^(e mod 32) with a precomputed
// power 2^(32 * floor(e / 32)) in base 10^9. No allocation.
#pragma once

namespace zul::text::detail {

// Writes the digits of the integral double whole (2^64 <= whole < 2^1024),
// without sign or leading zeros, at p (room for 309 characters) and returns
// the end.
char* put_large_integer(char* p, double whole) noexcept;

}  // namespace zul::text::detail
