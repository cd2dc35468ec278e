// MySQL backslash unescaping and the TRUE / FALSE rewrite, row by row.
#include "encodings/sql.h"

#include <gtest/gtest.h>

#include <string_view>

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
    EXPECT_EQ(decode_mysql(row.in), row.want);
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

}  // namespace
}  // namespace zul::encodings
