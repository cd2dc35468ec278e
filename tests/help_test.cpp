// The in-IDE help: exactly one entry in plugin/method_help.txt for each of
// the 64 declarations (which the registration test holds against what the
// plug-in registers); the rendered page links only to anchors it holds; the
// parser's and renderer's edge cases; and the examples run: every example
// line whose "//" comment states a result is evaluated through the stand-in
// host with the shipped plug-in and compared with the comment. An entry
// whose stated result cannot be evaluated (it reads variables) says so in an
// "unchecked:" field, and only then is it skipped. The examples need the
// calls by declaration of the zul tool (libffi), so test binaries built
// without it (those cross-built for other platforms) check the page only.
//
// Literals understood, as the host's BASIC writes them: "text" ("" for a
// quote), integers, doubles, True / False, ChrB(&hNN) and EndOfLine, joined
// by "+" for strings. Results in comments: a number (", remark" may follow),
// "about 0.039" (equal to the digits shown), True / False, a string
// expression in the same literal forms, or "bytes EF BB BF" for raw bytes.
#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#ifdef ZUL_TOOL_PATH
#include "host/dynamic_call.h"
#include "host/host.h"
#include "host/text_convert.h"
#include "host/zul_cli.h"
#endif
#include "tests/declarations.h"
#include "tools/help_page.h"

namespace {

std::string read_help_source() {
  auto path =
      std::filesystem::path(__FILE__).parent_path().parent_path() / "plugin" / "method_help.txt";
  std::ifstream in(path, std::ios::binary);
  EXPECT_TRUE(in.good()) << path;
  return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

#ifdef ZUL_TOOL_PATH
using zul_host::DynamicValue;
using zul_host::ValueType;

// EndOfLine differs between platforms; any fixed value works, as examples
// use it on both sides.
constexpr std::string_view kEndOfLine = "\n";

struct literal {
  enum kind { text, integer, real, boolean } kind = text;
  std::string bytes;       // text: the bytes
  bool raw_bytes = false;  // text: holds ChrB bytes, so it has no declared encoding
  std::string written;     // numbers: as written
  bool truth = false;
};

using zul::help::detail::trim;

// One string term at the start of s ("text", ChrB(&hNN), EndOfLine); s
// loses it. False when s starts with none.
bool take_string_term(std::string_view& s, literal& out) {
  if (s.starts_with("\"")) {
    std::size_t i = 1;
    for (; i < s.size(); ++i) {
      if (s[i] != '"') {
        out.bytes += s[i];
      } else if (i + 1 < s.size() && s[i + 1] == '"') {
        out.bytes += '"';
        ++i;
      } else {
        break;
      }
    }
    if (i >= s.size()) return false;
    s.remove_prefix(i + 1);
    return true;
  }
  if (s.starts_with("ChrB(&h") && s.size() >= 10 && s[9] == ')') {
    out.bytes += static_cast<char>(std::strtoul(std::string(s.substr(7, 2)).c_str(), nullptr, 16));
    out.raw_bytes = true;
    s.remove_prefix(10);
    return true;
  }
  if (s.starts_with("EndOfLine")) {
    out.bytes += kEndOfLine;
    s.remove_prefix(9);
    return true;
  }
  return false;
}

// A literal at the start of text; rest receives what follows it.
std::optional<literal> parse_literal(std::string_view text, std::string_view* rest = nullptr) {
  std::string_view s = trim(text);
  literal out;
  if (take_string_term(s, out)) {
    for (std::string_view t = trim(s); t.starts_with("+"); t = trim(s)) {
      s = trim(t.substr(1));
      if (!take_string_term(s, out)) return std::nullopt;
    }
  } else if (s.starts_with("True") || s.starts_with("False")) {
    out.kind = literal::boolean;
    out.truth = s.starts_with("True");
    s.remove_prefix(out.truth ? 4 : 5);
  } else {
    std::size_t n = 0;
    while (n < s.size() && (std::isdigit(static_cast<unsigned char>(s[n])) || s[n] == '-' ||
                            s[n] == '.' || s[n] == 'e' || s[n] == '+')) {
      ++n;
    }
    if (n == 0) return std::nullopt;
    out.written = std::string(s.substr(0, n));
    out.kind =
        out.written.find_first_of(".e") == std::string::npos ? literal::integer : literal::real;
    s.remove_prefix(n);
  }
  if (rest) *rest = s;
  return out;
}

// The literal as a zul command-line argument, so that zul's own overload
// choice picks the declaration.
std::string as_argument(const literal& l) {
  switch (l.kind) {
    case literal::text: {
      if (!l.raw_bytes) return "utf8:" + l.bytes;
      std::string hex = "hex:";
      for (const unsigned char c : l.bytes) {
        hex += "0123456789ABCDEF"[c >> 4];
        hex += "0123456789ABCDEF"[c & 15];
      }
      return hex;
    }
    case literal::boolean:
      return l.truth ? "true" : "false";
    default:
      return l.written;
  }
}

// One checkable example: the ZUL call's name and literal arguments, and
// the comment stating its result.
struct example {
  std::string name;
  std::vector<literal> args;
  std::string comment;
  std::string line;
};

// Splits a line into code and its "//" comment (outside string literals).
std::pair<std::string_view, std::string_view> split_comment(std::string_view line) {
  bool quoted = false;
  for (std::size_t i = 0; i + 1 < line.size(); ++i) {
    if (line[i] == '"') quoted = !quoted;
    if (!quoted && line[i] == '/' && line[i + 1] == '/') {
      return {line.substr(0, i), trim(line.substr(i + 2))};
    }
  }
  return {line, {}};
}

// The first ...ZUL( call in code with only literal arguments, or nothing.
std::optional<example> find_call(std::string_view code) {
  const std::size_t open = code.find("ZUL(");
  if (open == std::string_view::npos) return std::nullopt;
  std::size_t start = open;
  while (start > 0 &&
         (std::isalnum(static_cast<unsigned char>(code[start - 1])) || code[start - 1] == '_')) {
    --start;
  }
  example e;
  e.name = std::string(code.substr(start, open + 3 - start));
  std::string_view s = code.substr(open + 4);
  if (trim(s).starts_with(")")) return e;
  while (true) {
    std::string_view rest;
    auto arg = parse_literal(s, &rest);
    if (!arg) return std::nullopt;
    e.args.push_back(std::move(*arg));
    rest = trim(rest);
    if (rest.starts_with(")")) return e;
    if (!rest.starts_with(",")) return std::nullopt;
    s = rest.substr(1);
  }
}

// "" when the value matches the result a comment states, else what it got.
std::string mismatch(const DynamicValue& got, std::string_view comment) {
  const std::string shown = "got " + zul_host::format_value(got);
  if (comment.starts_with("about ")) {
    const std::string digits(trim(comment.substr(6)));
    const std::size_t point = digits.find('.');
    const int decimals = point == std::string::npos ? 0 : int(digits.size() - point - 1);
    const double want = std::strtod(digits.c_str(), nullptr);
    const bool near = std::fabs(got.real - want) <= 0.5 * std::pow(10, -decimals);
    return got.type == ValueType::double_ && near ? "" : shown;
  }
  if (comment.starts_with("bytes ")) {
    std::string want;
    std::string_view digits = comment.substr(6);
    digits = digits.substr(0, digits.find(','));
    for (std::string_view hex = trim(digits); !hex.empty(); hex = trim(hex.substr(2))) {
      want += static_cast<char>(std::strtoul(std::string(hex.substr(0, 2)).c_str(), nullptr, 16));
    }
    const std::string& bytes = got.type == ValueType::string ? got.string.bytes : got.block.bytes;
    return bytes == want ? "" : shown;
  }
  std::string_view rest;
  const auto want = parse_literal(comment, &rest);
  if (!want || !(trim(rest).empty() || trim(rest).starts_with(","))) {
    return "the comment states no result in a form the test reads";
  }
  switch (want->kind) {
    case literal::integer:
      return got.type == ValueType::integer && std::to_string(got.integer) == want->written ? ""
                                                                                            : shown;
    case literal::real:
      return got.type == ValueType::double_ &&
                     got.real == std::strtod(want->written.c_str(), nullptr)
                 ? ""
                 : shown;
    case literal::boolean:
      return got.type == ValueType::boolean && got.boolean == want->truth ? "" : shown;
    case literal::text: {
      if (got.type != ValueType::string) return shown;
      // Text as the host would show it: converted to UTF-8 from a declared
      // text encoding; bytes without one are compared as they are.
      std::string text = got.string.bytes;
      if (got.string.encoding != text_encoding::kUnknown) {
        if (auto utf8 = zul_host::convert_text(text, got.string.encoding, text_encoding::kUTF8))
          text = *utf8;
      }
      return text == want->bytes ? "" : "got \"" + text + "\"";
    }
  }
  return shown;
}

TEST(help_examples, stated_results_hold) {
  const zul::help::parsed help = zul::help::parse_help(read_help_source());
  ASSERT_EQ(help.error, "");
  zul_host::Host host;
  host.load(ZUL_PLUGIN_PATH);
  int checked = 0, skipped = 0;
  for (const zul::help::entry& e : help.entries) {
    SCOPED_TRACE(e.declaration);
    std::optional<example> last;  // a comment-only line states the previous call's result
    for (const std::string& line : e.example) {
      const auto [code, comment] = split_comment(line);
      if (!trim(code).empty()) last = find_call(code);
      if (comment.empty()) continue;
      if (!e.unchecked.empty()) {
        ++skipped;
        continue;
      }
      ASSERT_TRUE(last) << "a result is stated but the call has arguments that are not "
                           "literals; say why in \"unchecked:\": "
                        << line;
      std::vector<std::string> args;
      for (const literal& l : last->args) args.push_back(as_argument(l));
      std::vector<DynamicValue> values;
      const auto declaration =
          zul_host::choose_overload(host.registration(), last->name, args, values);
      ASSERT_TRUE(declaration) << "no overload of " << last->name << " fits: " << line;
      const DynamicValue got = zul_host::call_dynamic(host, *declaration, values);
      EXPECT_EQ(host.last_ledger_report(), "") << line;
      EXPECT_FALSE(host.last_exception()) << line;
      EXPECT_EQ(mismatch(got, comment), "") << line;
      ++checked;
    }
  }
  // 39 examples state a result; three entries read variables.
  EXPECT_GE(checked, 36) << skipped << " skipped";
}
#endif  // ZUL_TOOL_PATH

}  // namespace

TEST(help_source, lists_the_64_declarations_once_each) {
  zul::help::parsed help = zul::help::parse_help(read_help_source());
  ASSERT_EQ(help.error, "");
  EXPECT_EQ(help.entries.size(), std::size(kDeclarations));
  std::map<std::string, int> counts;
  for (const auto& e : help.entries) ++counts[e.declaration];
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
