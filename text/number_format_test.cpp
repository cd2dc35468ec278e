// Number formatting against the references that keep the first exact digit
// generator (tests/reference), which in turn are checked against the C
// library of this machine (glibc prints exact, correctly rounded digits).
// Values: random bit patterns, every power of two and of ten with their
// neighbours, subnormals, and values next to the plain text's rounding
// boundaries, where a long run of 9s or 0s follows the deciding digit.
#include "text/number_format.h"

#include <gtest/gtest.h>

#include <bit>
#include <cfloat>
#include <cmath>
#include <cstdio>
#include <limits>
#include <random>
#include <string>

#include "tests/reference/number_format_reference.h"

namespace {

using zul::reference::format_fixed_reference;
using zul::reference::format_plain_reference;
using zul::reference::format_scientific_reference;
using zul::text::format_plain;
using zul::text::format_scientific;

constexpr double kInf = std::numeric_limits<double>::infinity();

std::string c_library(const char* format, int precision, double d, std::size_t size) {
  char buffer[600] = {};
  std::snprintf(buffer, size, format, precision, d);
  return buffer;
}

void add_with_neighbours(std::vector<double>& values, double d) {
  values.push_back(d);
  values.push_back(std::nextafter(d, 0.0));
  values.push_back(std::nextafter(d, kInf));
  values.push_back(-d);
}

// Decimal texts of 15 or 16 significant digits followed by 5, or by a long
// run of 9s or 0s, at many magnitudes: the doubles nearest to them sit
// where the cut's deciding digit and the "%.99f" rounding are closest.
void add_rounding_boundaries(std::vector<double>& values, std::mt19937_64& random) {
  static constexpr const char* kTails[] = {"5", "49999999999999999", "50000000000000001",
                                           "9999999999999999999", "0000000000000000001"};
  for (int i = 0; i < 4000; ++i) {
    std::string digits = "0.";
    for (int k = 0, n = 14 + static_cast<int>(random() % 3); k < n; ++k) {
      digits += static_cast<char>('0' + random() % 10);
    }
    digits += kTails[random() % 5];
    digits += 'e';
    digits += std::to_string(static_cast<int>(random() % 60) - 30);
    add_with_neighbours(values, std::strtod(digits.c_str(), nullptr));
  }
}

const std::vector<double>& sample_doubles() {
  static const std::vector<double> values = [] {
    std::vector<double> v = {0.0,      1.5,    2.5,      0.125,    1e23,   9.5,     0.05,
                             999.9995, 1e-320, DBL_MAX,  DBL_MIN,  5e-324, 1.0 / 3, 0.1,
                             99.99,    1234.5, 9.999999, 0x1p-100, 4e-100, 5e-100,  6e-100,
                             1e-80,    1e-81,  0x1p64,   0x1p53,   1e15,   1e14};
    for (std::size_t i = 0, n = v.size(); i < n; ++i) add_with_neighbours(v, v[i]);
    for (int e = -1074; e <= 1023; ++e) add_with_neighbours(v, std::ldexp(1.0, e));
    for (int e = -323; e <= 308; ++e) add_with_neighbours(v, std::pow(10.0, e));
    std::mt19937_64 random(42);
    for (int i = 0; i < 4000; ++i) {
      const double d = std::bit_cast<double>(random());
      if (std::isfinite(d)) v.push_back(d);
      v.push_back(std::bit_cast<double>(random() & 0x800FFFFFFFFFFFFF));  // subnormal
      v.push_back(
          std::ldexp(static_cast<double>(random() >> 11), -static_cast<int>(random() % 120)));
    }
    add_rounding_boundaries(v, random);
    return v;
  }();
  return values;
}

TEST(format_fixed_reference, matches_c_library) {
  for (const double d : sample_doubles()) {
    for (const int precision : {0, 17, 99}) {
      SCOPED_TRACE(testing::Message() << std::hexfloat << d << " precision " << precision);
      ASSERT_EQ(format_fixed_reference(d, precision), c_library("%.*f", precision, d, 500));
    }
  }
}

TEST(format_scientific, matches_c_library_and_reference) {
  std::mt19937 random(7);
  for (const double d : sample_doubles()) {
    const int precision = static_cast<int>(random() % 40);
    SCOPED_TRACE(testing::Message() << std::hexfloat << d << " precision " << precision);
    const std::string want = c_library("%.*e", precision, d, 499);
    ASSERT_EQ(format_scientific(d, precision).view(), want);
    ASSERT_EQ(format_scientific_reference(d, precision), want);
  }
}

TEST(format_scientific, long_texts_are_cut_like_the_c_library) {
  for (const double d : {1.0 / 3, -DBL_MAX, 5e-324, 0.0, -0x1.fffffffffffffp-1022}) {
    for (const int precision : {494, 495, 496, 497, 766, 767, 768, 801, 1000, 5000}) {
      SCOPED_TRACE(testing::Message() << d << " precision " << precision);
      EXPECT_EQ(format_scientific(d, precision).view(), c_library("%.*e", precision, d, 499));
    }
  }
  EXPECT_EQ(format_scientific(1.0, 1000).size, 498u);
  EXPECT_EQ(format_scientific(1.0, 0x7FFFFFFF).size, 498u);
}

// What the C library comparison above cannot reach: nan, whose sign the C
// library prints, and digit counts outside 0..39 as the host passes them.
TEST(format_scientific, nan_and_digit_counts) {
  const struct {
    double d;
    std::int64_t digits;
    std::string_view want;
    const char* why;
  } rows[] = {
      {std::nan(""), 3, "nan", "nan"},
      {-std::nan(""), 3, "nan", "a negative nan shows no sign"},
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
      {6e-100,
       "0.000000000000000000000000000000000000000000000000000000000000000000000000"
       "000000000000000000000000001",
       "rounds up to the 99th decimal"},
      {kInf, "inf", "infinity"},
      {-kInf, "-inf", "minus infinity"},
      {std::nan(""), "nan", "nan"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(format_plain(row.d).view(), row.want);
    EXPECT_EQ(format_plain_reference(row.d), row.want);
  }
}

TEST(format_plain, matches_reference) {
  for (const double d : sample_doubles()) {
    SCOPED_TRACE(testing::Message() << std::hexfloat << d);
    ASSERT_EQ(format_plain(d).view(), format_plain_reference(d));
  }
}

// A bounded run of everyday values (random digits at magnitudes from 1e-20
// to 1e20, where the reference is quick), for the rare guard patterns that
// the sample above may miss: a quarter of a second here, several seconds
// under the sanitizers. The fuzz target's random run adds more.
TEST(format_plain, matches_reference_on_random_everyday_values) {
  std::mt19937_64 random(2024);
  std::uniform_real_distribution<double> mantissa(1.0, 10.0);
  for (int i = 0; i < 250000; ++i) {
    const double d = mantissa(random) * std::pow(10.0, static_cast<int>(random() % 41) - 20);
    ASSERT_EQ(format_plain(d).view(), format_plain_reference(d)) << std::hexfloat << d;
  }
}

}  // namespace
