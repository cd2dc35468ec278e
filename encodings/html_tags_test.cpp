// Tag removal by bracket depth over UTF-8 bytes, row by row.
#include "encodings/html_tags.h"

#include <gtest/gtest.h>

#include <string_view>

namespace zul::encodings {
namespace {

using namespace std::string_view_literals;

TEST(remove_html_tags, bracket_depth) {
  struct {
    std::string_view in, replacement, want;
    const char* why;
  } rows[] = {
      {"<b>bold</b> text", "", "bold text", "simple tags"},
      {"a < b and x > d", "", "a  d", "text between brackets is a tag"},
      {"x<a<b>>y", "", "xy", "nesting is counted"},
      {"a>b<c", "", "ac", "surplus '>' makes the depth -1"},
      {"a<b", "", "a", "unclosed tag"},
      {"<p>", "", "", "only a tag"},
      {"\xC3\xA9<i>\xC3\xBC</i>", "", "\xC3\xA9\xC3\xBC", "UTF-8 kept outside tags"},
      {"a<\xC3\xA9>b", "*", "a**b", "one replacement per byte inside"},
      {"a<br>b", " ", "a  b", "two bytes inside, two replacements"},
      {"\0"sv, "", "", "zero bytes are dropped"},
      {"a\0b"sv, "", "ab", "zero byte between text"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(remove_html_tags(row.in, row.replacement), row.want);
  }
}

}  // namespace
}  // namespace zul::encodings
