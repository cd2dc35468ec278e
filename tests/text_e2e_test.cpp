// UTF-8 repair and byte classes end to end: each row calls one registered
// declaration through the stand-in host (ledger checked after every call)
// and checks the result's bytes and the encoding it carries.
#include <string>
#include <string_view>

#include "tests/declarations.h"
#include "tests/host_fixture.h"

namespace {

using zul_host::Block;
using zul_host::null_string;
using zul_host::Str;
using zul_host::tagged;
using zul_host::utf8;
using namespace text_encoding;

const auto kCheckP = decl(4), kCheckM = decl(5), kCheckS = decl(6), kReplace = decl(47),
           kIsASCII1 = decl(48), kIsASCII2 = decl(49);

using Text = HostTest;

// All three overloads see the same bytes; the result is marked UTF-8.
TEST_F(Text, check_utf8_overloads_agree) {
  struct {
    std::string_view in;
    Str placeholder, want;
    const char* why;
  } rows[] = {
      {"caf\xE9", utf8("?"), utf8("caf?"), "Latin-1 byte"},
      {"caf\xC3\xA9 \xF0\x9F\x98\x80", utf8("?"), utf8("caf\xC3\xA9 \xF0\x9F\x98\x80"),
       "well-formed kept"},
      {"plain", utf8("?"), utf8("plain"), "ASCII comes back marked UTF-8"},
      {"ab\xE2\x82", utf8("?"), utf8("ab??"), "cut by the end"},
      {"a\xFF", utf16(u"\uFFFD"), utf8("a\xEF\xBF\xBD"), "UTF-16 placeholder inserted as UTF-8"},
      {"a\xFF"
       "b",
       null_string(), utf8("ab"), "null placeholder drops bytes"},
      {"\xFF\xFE", null_string(), null_string(), "nothing left: null string"},
      {"a\xFF", tagged(std::string("<\0>", 3), kUTF8), utf8("a<"),
       "placeholder ends at its zero byte"},
      {std::string_view("\0\xFF", 2), utf8("?"), tagged(std::string("\0?", 2), kUTF8),
       "zero byte passes"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    const std::string data(row.in);
    EXPECT_TRUE(same(call<Str>(kCheckS, tagged(data, kUnknown), row.placeholder), row.want));
    EXPECT_TRUE(same(call<Str>(kCheckM, Block{data, false}, row.placeholder), row.want));
    EXPECT_TRUE(same(call<Str>(kCheckP, static_cast<const void*>(data.data()),
                               static_cast<std::int64_t>(data.size()), row.placeholder),
                     row.want));
    EXPECT_FALSE(raised());
  }
}

TEST_F(Text, check_utf8_without_bytes_skips_the_placeholder) {
  const Str placeholder = utf16(u"\uFFFD");  // reading it would need a host conversion
  const int before = host_.service_calls("PluginGetStringData");
  const char* text = "abc";
  EXPECT_TRUE(call<Str>(kCheckS, null_string(), placeholder).null);
  EXPECT_TRUE(call<Str>(kCheckS, utf8(""), placeholder).null);
  EXPECT_TRUE(call<Str>(kCheckM, Block{"", true}, placeholder).null);
  EXPECT_TRUE(call<Str>(kCheckM, Block{"", false}, placeholder).null);
  EXPECT_TRUE(
      call<Str>(kCheckP, static_cast<const void*>(nullptr), std::int64_t{3}, placeholder).null);
  EXPECT_TRUE(
      call<Str>(kCheckP, static_cast<const void*>(text), std::int64_t{0}, placeholder).null);
  EXPECT_TRUE(
      call<Str>(kCheckP, static_cast<const void*>(text), std::int64_t{-1}, placeholder).null);
  EXPECT_EQ(host_.service_calls("PluginGetStringData"), before);
}

TEST_F(Text, is_ascii_string) {
  struct {
    Str s;
    bool mode0, mode1, mode2;
    const char* why;
  } rows[] = {
      {null_string(), false, false, false, "null string"},
      {utf8(""), false, false, false, "empty string"},
      {utf8("abc"), true, true, true, "plain text"},
      {utf8("a\tb"), true, false, false, "tab is a control byte"},
      {utf8("a\x7F"), true, true, true, "7F counts as printable"},
      {utf8("caf\xC3\xA9"), false, false, true, "UTF-8 bytes are non-control"},
      {utf16(u"ab"), true, false, false, "UTF-16 zero bytes as stored"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(call<bool>(kIsASCII1, row.s), row.mode0);
    EXPECT_EQ(call<bool>(kIsASCII2, row.s, std::int64_t{0}), row.mode0);
    EXPECT_EQ(call<bool>(kIsASCII2, row.s, std::int64_t{1}), row.mode1);
    EXPECT_EQ(call<bool>(kIsASCII2, row.s, std::int64_t{2}), row.mode2);
    EXPECT_FALSE(call<bool>(kIsASCII2, row.s, std::int64_t{3}));
    EXPECT_FALSE(call<bool>(kIsASCII2, row.s, std::int64_t{-1}));
  }
}

TEST_F(Text, replace_non_printable_characters) {
  struct {
    Str s;
    std::int64_t value;
    Str want;
    const char* why;
  } rows[] = {
      {utf8("a\tb"), 46, tagged("a.b", kASCII), "default full stop"},
      {utf8("\xC3\xA9"), 46, tagged("..", kASCII), "each byte of a character"},
      {utf8("x\x01y"), 321, tagged("xAy", kASCII), "low 8 bits of the value"},
      {utf8("x\x01y"), 0, tagged(std::string("x\0y", 3), kASCII), "zero replacement byte"},
      {utf8("a\x01"), 0xE9, tagged("a\xE9", kASCII), "marked ASCII whatever the byte"},
      {utf8(" ~\x7F"), 46, tagged(" ~\x7F", kASCII), "20..7F kept"},
      {null_string(), 46, null_string(), "null string"},
      {utf8(""), 46, null_string(), "empty string"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_TRUE(same(call<Str>(kReplace, row.s, row.value), row.want));
  }
}

}  // namespace
