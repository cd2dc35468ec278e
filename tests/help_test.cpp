// The in-IDE help against what the plug-in really registers: every
// declaration the stand-in host receives has exactly one entry in
// plugin/method_help.txt and the list matches the 64 declarations; the
// rendered page links only to anchors it holds. Also the parser's and the
// renderer's edge cases (escaping, malformed sources, anchors of overloads).
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <string>

#include "tests/declarations.h"
#include "tests/host_fixture.h"
#include "tools/help_page.h"

namespace {

std::string read_help_source() {
  auto path =
      std::filesystem::path(__FILE__).parent_path().parent_path() / "plugin" / "method_help.txt";
  std::ifstream in(path, std::ios::binary);
  EXPECT_TRUE(in.good()) << path;
  return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

std::map<std::string, int> count_declarations(const zul::help::parsed& help) {
  std::map<std::string, int> counts;
  for (const auto& e : help.entries) ++counts[e.declaration];
  return counts;
}

class Help : public HostTest {};

}  // namespace

TEST_F(Help, every_registered_declaration_has_one_entry) {
  zul::help::parsed help = zul::help::parse_help(read_help_source());
  ASSERT_EQ(help.error, "");
  std::map<std::string, int> counts = count_declarations(help);
  ASSERT_FALSE(host_.registration().methods.empty());
  for (const auto& method : host_.registration().methods) {
    EXPECT_EQ(counts[method.declaration], 1) << method.declaration;
  }
}

TEST(help_source, lists_the_64_declarations_once_each) {
  zul::help::parsed help = zul::help::parse_help(read_help_source());
  ASSERT_EQ(help.error, "");
  EXPECT_EQ(help.entries.size(), std::size(kDeclarations));
  std::map<std::string, int> counts = count_declarations(help);
  for (const char* declaration : kDeclarations) EXPECT_EQ(counts[declaration], 1) << declaration;
  for (const auto& e : help.entries) {
    SCOPED_TRACE(e.declaration);
    EXPECT_FALSE(e.arguments.empty());  // every declaration takes arguments
  }
}

TEST(help_page, every_link_reaches_an_anchor) {
  zul::help::parsed help = zul::help::parse_help(read_help_source());
  ASSERT_EQ(help.error, "");
  std::string html = zul::help::render_help(help.entries);
  EXPECT_EQ(zul::help::broken_links(html), std::vector<std::string>{});
  for (const auto& e : help.entries) {
    SCOPED_TRACE(e.declaration);
    EXPECT_NE(html.find("<section class=\"entry\" id=\"" + e.anchor + "\">"), std::string::npos);
    EXPECT_NE(html.find("<a href=\"#" + e.anchor + "\">"), std::string::npos);
  }
}

TEST(help_page, escapes_markup) {
  struct {
    std::string_view in, want;
    const char* why;
  } rows[] = {
      {"", "", "empty"},
      {"plain text", "plain text", "nothing to escape"},
      {"a<b>&\"c\"", "a&lt;b&gt;&amp;&quot;c&quot;", "all four"},
      {"&amp;", "&amp;amp;", "a reference is text, escaped again"},
      {"it's é", "it's é", "apostrophe and UTF-8 stay"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(zul::help::escape_html(row.in), row.want);
  }
}

TEST(help_page, finds_broken_links) {
  struct {
    std::string_view html;
    std::vector<std::string> want;
    const char* why;
  } rows[] = {
      {R"(<a href="#x">x</a><p id="x">)", {}, "anchor present"},
      {R"(<a href="#x">x</a><p id="y">)", {"#x"}, "anchor missing"},
      {R"(<a href="#x">x</a><p id="xy">)", {"#x"}, "prefix of an id is no match"},
      {R"(<a href="other.html">o</a>)", {"other.html"}, "no other pages in the help folder"},
      {R"(<p id="x"><a href="#x"></a><a href="#z"></a>)", {"#z"}, "second link broken"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(zul::help::broken_links(row.html), row.want);
  }
}

TEST(help_source, rejects_malformed_entries) {
  struct {
    std::string_view source;
    std::string_view error_start;
    const char* why;
  } rows[] = {
      {"@ F() as string\nsummary: s\n", "line 1: entry before", "entry outside a family"},
      {"== F\nsummary: s\n", "line 2: field before", "field outside an entry"},
      {"== F\n@ F() as string\nsummary s\n", "line 3: expected", "no colon"},
      {"== F\n@ F() as string\nsumary: s\n", "line 3: unknown field", "misspelt field"},
      {"== F\n@ F() as string\nsummary: s\nresult: r\n", "F() as string: needs", "no example"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_TRUE(zul::help::parse_help(row.source).error.starts_with(row.error_start))
        << zul::help::parse_help(row.source).error;
  }
}

TEST(help_source, numbers_overloads_and_keeps_continuations) {
  zul::help::parsed help = zul::help::parse_help(
      "== Fam\n"
      "@ A(x as integer) as integer\nsummary: one\n  two\nresult: r\nexample: x = A(1)\nexample:   "
      "indented\n"
      "@ B() as string\nsummary: s\nresult: r\nexample: b\n"
      "@ A() as integer\nsummary: s\nresult: r\nexample: a\n");
  ASSERT_EQ(help.error, "");
  ASSERT_EQ(help.entries.size(), 3u);
  EXPECT_EQ(help.entries[0].anchor, "A-1");
  EXPECT_EQ(help.entries[1].anchor, "B");
  EXPECT_EQ(help.entries[2].anchor, "A-2");
  EXPECT_EQ(help.entries[0].summary, "one two");
  EXPECT_EQ(help.entries[0].example, (std::vector<std::string>{"x = A(1)", "  indented"}));
  EXPECT_EQ(help.entries[0].family, "Fam");
}
