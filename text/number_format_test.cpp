// Number formatting against the C library (glibc prints exact, correctly
// rounded digits, so it serves as the model on random doubles) and against
// tables of the plain text's cut, rounding and zero rules.
#include "text/number_format.h"

#include <gtest/gtest.h>

#include <bit>
#include <cfloat>
#include <cmath>
#include <cstdio>
#include <limits>
#include <random>
#include <string>

namespace {

using zul::text::format_plain;
using zul::text::format_scientific;
using zul::text::detail::format_fixed;

constexpr double kInf = std::numeric_limits<double>::infinity();

std::string c_library(const char* format, int precision, double d, std::size_t size) {
  char buffer[600] = {};
  std::snprintf(buffer, size, format, precision, d);
  return buffer;
}

// Random finite doubles over the whole exponent range, plus values where
// rounding is a tie or a carry.
std::vector<double> sample_doubles() {
  std::vector<double> values = {0.0,    -0.0,    0.5,      1.5,    2.5,     0.125,     1e23,
                                9.5,    0.05,    999.9995, 1e-320, DBL_MAX, -DBL_MAX,  DBL_MIN,
                                5e-324, 1.0 / 3, 0.1,      99.99,  1234.5,  -9.999999, 0x1p-100};
  std::mt19937_64 random(42);
  while (values.size() < 3000) {
    const double d = std::bit_cast<double>(random());
    if (std::isfinite(d)) values.push_back(d);
  }
  for (int i = 0; i < 1000; ++i) {  // everyday magnitudes too
    values.push_back(
        std::ldexp(static_cast<double>(random() >> 11), -static_cast<int>(random() % 80)));
  }
  return values;
}

TEST(format_fixed, matches_c_library_on_random_doubles) {
  for (const double d : sample_doubles()) {
    for (const int precision : {0, 1, 2, 17, 99}) {
      SCOPED_TRACE(testing::Message() << std::hexfloat << d << " precision " << precision);
      ASSERT_EQ(format_fixed(d, precision).view(), c_library("%.*f", precision, d, 500));
    }
  }
}

TEST(format_scientific, matches_c_library_on_random_doubles) {
  std::mt19937 random(7);
  for (const double d : sample_doubles()) {
    const int precision = static_cast<int>(random() % 40);
    SCOPED_TRACE(testing::Message() << std::hexfloat << d << " precision " << precision);
    ASSERT_EQ(format_scientific(d, precision).view(), c_library("%.*e", precision, d, 499));
  }
}

TEST(format_scientific, long_texts_are_cut_like_the_c_library) {
  for (const double d : {1.0 / 3, -DBL_MAX, 5e-324, 0.0}) {
    for (const int precision : {495, 496, 497, 1000, 5000}) {
      SCOPED_TRACE(testing::Message() << d << " precision " << precision);
      EXPECT_EQ(format_scientific(d, precision).view(), c_library("%.*e", precision, d, 499));
    }
  }
  EXPECT_EQ(format_scientific(1.0, 1000).size, 498u);
}

TEST(format_scientific, table) {
  const struct {
    double d;
    std::int64_t digits;
    std::string_view want;
    const char* why;
  } rows[] = {
      {1234.5, 2, "1.23e+03", "rounded from the binary value"},
      {1234.5, 0, "1e+03", "no point for 0 digits"},
      {0.0, 3, "0.000e+00", "zero"},
      {-0.0, 1, "-0.0e+00", "negative zero keeps its sign"},
      {-kInf, 3, "-inf", "minus infinity"},
      {kInf, 3, "inf", "infinity"},
      {std::nan(""), 3, "nan", "nan"},
      {-std::nan(""), 3, "nan", "a negative nan shows no sign"},
      {9.96, 1, "1.0e+01", "carry into a new exponent"},
      {5e-324, 2, "4.94e-324", "three exponent digits"},
      {1234.5, -3, "1.234500e+03", "negative digits give six"},
      {1234.5, 0x100000002, "1.23e+03", "digits taken as 32 bits"},
      {1234.5, 0xFFFFFFFF, "1.234500e+03", "-1 in 32 bits"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(format_scientific(row.d, row.digits).view(), row.want);
  }
}

TEST(format_plain, table) {
  const struct {
    double d;
    std::string_view want;
    const char* why;
  } rows[] = {
      {0.0, "0.0", "zero"},
      {-0.0, "-0.0", "negative zero"},
      {2.0, "2.0", "zeros shrink to one"},
      {10.0, "10.0", "integer zeros stay"},
      {1.5, "1.50", "one zero after the last digit"},
      {-0.5, "-0.50", "minus sign counts in k"},
      {0.1, "0.10", "cut in a run of zeros"},
      {0.7, "0.70", "run of nines rounds up"},
      {1.0 / 3, "0.333333333333333", "fifteen characters, rounded down"},
      {99.99, "99.990", "rounds up inside the fraction"},
      {1e-7, "0.00000010", "leading zeros of the fraction do not count"},
      {0.99999999999999989, "1.0", "carry past the first digit"},
      {-9.9999999999999982, "-10.0", "carry after the minus sign"},
      {1000000.1, "1000000.099999999976717", "zeros of the integer do not count"},
      {123456789012345680.0, "123456789012345680", "k above 14 drops the fraction"},
      {-12345678901234567.0, "-12345678901234568", "minus sign and digits above 14"},
      {999999999999999.9, "1000000000000000", "k above 14 rounds at the point"},
      {123456789012345.5, "123456789012345.5", "k of 14 keeps one decimal"},
      {3.14159265358979, "3.14159265358979", "last digits differ"},
      {1e20, "100000000000000000000.0", "zeros before the point do not count"},
      {1e-300, "0.0", "all 99 decimals are zero"},
      {4e-100, "0.0", "rounds to zero at the 99th decimal"},
      {kInf, "inf", "infinity"},
      {-kInf, "-inf", "minus infinity"},
      {std::nan(""), "nan", "nan"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(format_plain(row.d).view(), row.want);
  }
}

// Whatever the double, the plain text is a prefix-rounded form of the full
// text: never longer than it, never with a dangling point or two zeros at
// the end of a fraction, and it parses back within the cut's tolerance.
TEST(format_plain, shape_on_random_doubles) {
  for (const double d : sample_doubles()) {
    const std::string text(format_plain(d).view());
    SCOPED_TRACE(testing::Message() << std::hexfloat << d << " -> " << text);
    ASSERT_FALSE(text.empty());
    ASSERT_NE(text.back(), '.');
    if (text.find('.') != std::string::npos) {
      ASSERT_FALSE(text.ends_with("00"));
    }
    const double back = std::strtod(text.c_str(), nullptr);
    const double tolerance = std::max(std::fabs(d) * 1e-13, 1e-99);
    ASSERT_LE(std::fabs(back - d), tolerance);
  }
}

}  // namespace
