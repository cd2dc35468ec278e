// Number formatting from an exact decimal expansion of the double, as first
// written: the reference that the shipped formatting (built on the standard
// library's exact conversions) is compared with. Not linked into the plug-in.
#pragma once

#include <cstdint>
#include <string>

namespace zul::reference {

// d as "%.Nf" (N from 0 to 400), cut after limit characters (at most 499):
// the exact digits rounded half to even, inf, -inf and nan (never -nan).
std::string format_fixed_reference(double d, int precision, std::size_t limit = 499);

// d as "%.Ne" with N = digits taken as a signed 32-bit value (a negative N
// counts as 6), cut after 498 characters.
std::string format_scientific_reference(double d, std::int64_t digits);

// The plain text of StrZUL: the "%.99f" text with a trailing run of zeros
// kept as one 0, cut to fifteen characters from the first significant one
// (or at the point when more than fourteen characters before the point are
// not 0), rounded up when the next digit of the "%.99f" text is 5 or more,
// and a trailing run of zeros after the point kept as one 0 again.
std::string format_plain_reference(double d);

}  // namespace zul::reference
