// The exact digits of large integral doubles against std::to_chars with
// precision 0, at every exponent from 2^64 up, with the smallest, the
// largest and a random mantissa, and at the doubles around powers of ten.
#include "text/integer_digits.h"

#include <gtest/gtest.h>

#include <charconv>
#include <cmath>
#include <random>
#include <string>
#include <vector>

namespace zul::text::detail {
namespace {

TEST(put_large_integer, every_exponent_matches_to_chars) {
  std::mt19937_64 random(8);
  std::vector<double> values;
  for (int e = 64; e <= 1023; ++e) {
    for (const double m : {1.0, 0x1.fffffffffffffp0, 1.0 + std::ldexp(random() >> 12, -52)}) {
      values.push_back(std::ldexp(m, e));
    }
  }
  for (int k = 20; k <= 308; ++k) {
    const double p = std::pow(10.0, k);
    for (const double d : {p, std::nextafter(p, 0.0), std::nextafter(p, HUGE_VAL)}) {
      if (d >= 0x1p64 && std::isfinite(d)) values.push_back(d);
    }
  }
  for (const double d : values) {
    char want[400], got[400];
    char* want_end = std::to_chars(want, want + 400, d, std::chars_format::fixed, 0).ptr;
    char* got_end = put_large_integer(got, d);
    ASSERT_EQ(std::string(got, got_end), std::string(want, want_end)) << std::hexfloat << d;
  }
}

}  // namespace
}  // namespace zul::text::detail
