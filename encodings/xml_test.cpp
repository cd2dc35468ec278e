// XML escaping over code points, row by row; the byte test of readiness is
// tabled end to end.
#include "encodings/xml.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>

namespace zul::encodings {
namespace {

using namespace std::string_view_literals;

code_points cps(std::u32string_view s) { return {s.begin(), s.end()}; }

TEST(encode_xml, markup_controls_and_marks) {
  struct {
    std::u32string_view in;
    std::int64_t options;
    std::u32string_view want;
    const char* why;
  } rows[] = {
      {U"a<b", 0, U"a&lt;b", "less-than"},
      {U"it's", 1, U"it&apos;s", "apostrophe named, options 1"},
      {U"\"&>", 0, U"&quot;&amp;&gt;", "the other three"},
      {U"a\u0007&", 0, U"a&amp;", "control dropped once rewritten"},
      {U"\t\n\r", 0, U"\t\n\r", "tab, LF and CR kept"},
      {U"\uFEFFa&", 0, U"a&amp;", "leading byte-order mark dropped"},
      {U"\U0001F600<", 0, U"\U0001F600&lt;", "astral character kept"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(encode_xml(cps(row.in), row.options), cps(row.want));
  }
}

TEST(xml_needs_escaping, whole_length) {
  EXPECT_FALSE(xml_needs_escaping(cps(U"caf\u00E9 \u65E5\u672C")));
  EXPECT_FALSE(xml_needs_escaping(cps(U"a\u0007")));
  EXPECT_TRUE(xml_needs_escaping(cps(U"a\0&"sv)));
  EXPECT_FALSE(xml_needs_escaping({}));
}

}  // namespace
}  // namespace zul::encodings
