// Tag removal: the bracket-depth rules row by row, and every byte-set search
// level against the byte-at-a-time reference with a bracket or zero byte at
// every position, with and without a replacement.
#include "encodings/html_tags.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>

#include "common/cpu.h"
#include "tests/reference/html_tags_reference.h"
#include "tests/sweep.h"

namespace zul::encodings {
namespace {

using namespace std::string_view_literals;

TEST(remove_html_tags, depth_rules) {
  struct {
    std::string_view in, replacement, want;
    const char* why;
  } rows[] = {
      {"a<b>c", "", "ac", "one tag"},
      {"a<b>c", "*", "a*c", "one replacement per byte inside"},
      {"a<<b>c>d", "", "ad", "nested brackets count"},
      {"a>b<c", "", "ac", "a stray > goes below zero, < comes back"},
      {"a\0b<\0>c"sv, "-", "abc", "zero bytes vanish everywhere"},
      {"<p>\xC3\xA9</p>", "", "\xC3\xA9", "UTF-8 kept whole"},
      {"<unclosed", "#", "########", "to the end"},
      {"a < b and x > d", "", "a  d", "text between brackets is a tag"},
      {"a<\xC3\xA9>b", "*", "a**b", "one replacement per byte inside"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(reference::remove_html_tags_reference(row.in, row.replacement), row.want);
    for (const simd::isa level : simd::supported_isas()) {
      EXPECT_EQ(remove_html_tags(row.in, row.replacement, kMaxResultBytes, level), row.want);
    }
  }
}

TEST(remove_html_tags, every_scan_level_with_a_bracket_everywhere) {
  const std::string specials("<>\0"sv);
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    testing_sweep::special_byte_sweep(specials, 2 * 64 + 3, [&](const std::string& in) {
      const std::string tagged = '<' + in;
      for (const std::string_view with : {""sv, "?"sv, "<long>"sv}) {
        ASSERT_EQ(remove_html_tags(in, with, kMaxResultBytes, level),
                  reference::remove_html_tags_reference(in, with));
        // The same with a tag opened before it, so the runs fall inside.
        ASSERT_EQ(remove_html_tags(tagged, with, kMaxResultBytes, level),
                  reference::remove_html_tags_reference(tagged, with));
      }
    });
  }
}

}  // namespace
}  // namespace zul::encodings
