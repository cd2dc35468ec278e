// MySQL backslash unescaping and the TRUE / FALSE rewrite, row by row.
#include "encodings/sql.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>

#include "common/cpu.h"
#include "tests/reference/sql_reference.h"
#include "tests/sweep.h"

namespace zul::encodings {
namespace {

using namespace std::string_view_literals;

TEST(decode_mysql, escapes) {
  struct {
    std::string_view in, want;
    const char* why;
  } rows[] = {
      {"It\\'s", "It's", "escaped quote"},
      {"\\\"", "\"", "escaped double quote"},
      {"\\\\n", "\\n", "an escaped backslash starts no new escape"},
      {"\\x", "\\x", "unknown escape keeps both bytes"},
      {"\\N", "\\N", "letters are case-sensitive"},
      {"50\\%", "50%", "percent"},
      {"a\\_b", "a_b", "underscore"},
      {"\\Z", "\x1A", "control-Z"},
      {"a\\0b", "a\0b"sv, "zero byte in the middle"},
      {"\\b\\n\\r\\t", "\b\n\r\t", "control letters"},
      {"end\\", "end\\", "a final backslash is kept"},
      {"", "", "empty"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(reference::decode_mysql_reference(row.in), row.want);
    for (const simd::isa level : simd::supported_isas())
      EXPECT_EQ(decode_mysql(row.in, level), row.want);
  }
}

// Backslashes (runs of them included), escape letters and other bytes at
// every position across block edges, and every byte after a backslash.
TEST(decode_mysql, every_level_with_an_escape_everywhere) {
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    const auto check = [&](const std::string& in) {
      ASSERT_EQ(decode_mysql(in, level), reference::decode_mysql_reference(in));
      ASSERT_EQ(decode_mysql("\\" + in, level), reference::decode_mysql_reference("\\" + in));
    };
    testing_sweep::special_byte_sweep("\\n\xE9", 2 * 64 + 3, check);
    std::string every = testing_sweep::every_byte_value();
    for (std::size_t k = 0; k < every.size(); k += 3) every[k] = '\\';
    check(every);
  }
}

TEST(replace_sql_booleans, words_outside_quotes) {
  struct {
    std::string_view in, want;
    const char* why;
  } rows[] = {
      {"SELECT * FROM t WHERE a = true AND b = FALSE ORDER BY c",
       "SELECT * FROM t WHERE a = 1 AND b = 0 ORDER BY c", "both words, any case"},
      {"WHERE a=true AND c", "WHERE a=true AND c", "after '=', a word byte"},
      {"WHERE a = true", "WHERE a = true", "fewer than five bytes after the t"},
      {"(true, false) AND x", "(1, 0) AND x", "brackets and comma separate"},
      {"x = 'true' AND y", "x = 'true' AND y", "inside single quotes"},
      {"x = \"false\" AND y", "x = \"false\" AND y", "inside double quotes"},
      {"trueish AND falsey", "trueish AND falsey", "not whole words"},
      {"WHERE x = TrUe AND y", "WHERE x = 1 AND y", "mixed case"},
      {"x = true;", "x = true;", "four bytes after the t"},
      {"x = true; ", "x = 1; ", "semicolon separates"},
      {"a\0 true AND"sv, "a", "cut at the first zero byte"},
      {"", "", "empty"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(replace_sql_booleans(row.in), row.want);
  }
}

// The candidate search on every kernel: every pair of (previous, current)
// byte values at every position of lengths across the vector widths.
TEST(find_boolean_candidate, all_byte_pairs_on_every_kernel) {
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    const detail::sql_kernels& k = detail::sql_kernels_for(level);
    std::string buf(200, 'x');
    const auto* p = reinterpret_cast<const std::uint8_t*>(buf.data()) + 1;
    for (unsigned before = 0; before < 256; ++before) {
      for (unsigned b = 0; b < 256; ++b) {
        const std::size_t at = (before * 7 + b) % 130, n = at + 1 + b % 67;
        buf[1 + at - 1] = static_cast<char>(before);
        buf[1 + at] = static_cast<char>(b);
        ASSERT_EQ(k.find_boolean_candidate(p, n), detail::find_boolean_candidate_scalar(p, n))
            << before << " " << b << " at " << at;
        buf[1 + at - 1] = buf[1 + at] = 'x';
      }
    }
  }
}

// The rewrite on every kernel against the byte-at-a-time reference: words,
// quotes and zero bytes at every position of lengths across the widths.
TEST(replace_sql_booleans, every_kernel_matches_the_reference) {
  const std::string_view pieces[] = {" true ", "(FALSE,", "'", "\"", "\0"sv, "tRuE;", " f", "t"};
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    const detail::sql_kernels& k = detail::sql_kernels_for(level);
    for (std::size_t n = 0; n <= 140; n += (n < 70 ? 1 : 7)) {
      const std::string plain = std::string(n, 'a').replace(0, n / 2, n / 2, ' ');
      for (std::size_t at = 0; at <= n; ++at) {
        for (const std::string_view piece : pieces) {
          std::string in = plain;
          in.insert(at, piece);
          in.insert(in.size() - at / 2, piece);
          ASSERT_EQ(replace_sql_booleans(in, k), zul::reference::replace_sql_booleans_reference(in))
              << in;
        }
      }
    }
  }
}

}  // namespace
}  // namespace zul::encodings
