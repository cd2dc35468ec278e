// Text inspection and character sets end to end: UTF-8 repair, byte classes,
// byte-order marks, encoding normalisation, ISO 8859-1 / Windows-1252 and
// number formatting. Each row calls one registered declaration through the
// stand-in host (ledger checked after every call) and checks the result's
// bytes and the encoding it carries.
#include <cstdint>
#include <limits>
#include <string>
#include <string_view>

#include "tests/declarations.h"
#include "tests/host_fixture.h"

namespace {

using namespace std::string_view_literals;
using zul_host::Block;
using zul_host::null_string;
using zul_host::Str;
using zul_host::tagged;
using zul_host::utf8;
using namespace text_encoding;

const auto kCheckP = decl(4), kCheckM = decl(5), kCheckS = decl(6), kReplace = decl(47),
           kIsASCII1 = decl(48), kIsASCII2 = decl(49), kDetect = decl(19), kMarker = decl(20),
           kUnicode = decl(27), kNative = decl(28), kToISO = decl(41), kFromISO = decl(42),
           kToCP = decl(43), kFromCP = decl(44), kScientific = decl(12), kStr = decl(13);

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
  const void *text = "abc", *nothing = nullptr;
  EXPECT_TRUE(call<Str>(kCheckS, null_string(), placeholder).null);
  EXPECT_TRUE(call<Str>(kCheckS, utf8(""), placeholder).null);
  EXPECT_TRUE(call<Str>(kCheckM, Block{"", true}, placeholder).null);
  EXPECT_TRUE(call<Str>(kCheckM, Block{"", false}, placeholder).null);
  for (const auto& [data, size] : {std::pair{nothing, 3}, {text, 0}, {text, -1}}) {
    EXPECT_TRUE(call<Str>(kCheckP, data, std::int64_t{size}, placeholder).null) << size;
  }
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

TEST_F(Text, conversions) {
  const struct {
    const char* declaration;
    Str in, want;
    const char* why;
  } rows[] = {
      {kFromCP, unknown("\x80z\x81"), utf8("\xE2\x82\xACz\0"sv), "euro, letter, undefined byte"},
      {kFromCP, tagged("\x93hi\x94", kUTF8), utf8("\xE2\x80\x9Chi\xE2\x80\x9D"),
       "stored bytes, tag ignored"},
      {kFromISO, unknown("\x80"), utf8("\xC2\x80"), "C1 control kept"},
      {kFromISO, unknown("caf\xE9"), utf8("caf\xC3\xA9"), "Latin-1 letter"},
      {kFromISO, utf8(""), none(), "decode empty"},
      {kFromCP, null_string(), none(), "decode null"},
      {kToISO, utf8("na\xC3\xAFve"), unknown("na\xEFve"), "Latin-1 letter, no declared encoding"},
      {kToISO, utf8("a\xE2\x82\xACz"), ascii("az"), "euro dropped, all ASCII"},
      {kToCP, utf8("a\xE2\x82\xACz"), unknown("a\x80z"), "euro kept"},
      {kToCP, utf8("a\xC2\x81z"), ascii("az"), "C1 control dropped"},
      {kToCP, utf8("a\0b"sv), ascii("a\0b"sv), "U+0000 kept"},
      {kToCP, utf8("\xCE\xB1\xCE\xB2\xCE\xB3"), none(), "nothing encodable"},
      {kToISO, utf8("\xC3\xA9"), unknown("\xE9"), "one character"},
      {kToCP, utf8("\xE2\x84\xA2\xC5\xB8"), unknown("\x99\x9F"), "two characters"},
      {kToISO, utf8("x\xF0\x9F\x98\x80y"), ascii("xy"), "surrogate pair dropped"},
      {kToCP, tagged("\xE9\x00\x20\x00"sv, kUTF16), unknown("\xE9 "), "from UTF-16"},
      {kToISO, tagged("\xE9", kLatin1), unknown("\xE9"), "from Latin-1"},
      {kToISO, utf8("\xEF\xBB\xBFxy"), ascii("xy"), "byte-order mark not encoded"},
      {kToISO, utf8(""), none(), "encode empty"},
      {kToCP, null_string(), none(), "encode null"},
      {kUnicode, utf8("\xC3\xA9"), tagged("\xE9\x00"sv, kUTF16), "to UTF-16"},
      {kUnicode, utf8(""), none(), "to UTF-16, empty"},
      {kUnicode, null_string(), none(), "to UTF-16, null"},
      {kNative, tagged("caf\xE9", kLatin1), utf8("caf\xC3\xA9"), "to UTF-8"},
      {kNative, tagged(""sv, kLatin1), none(), "to UTF-8, empty"},
      {kNative, null_string(), none(), "to UTF-8, null"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_TRUE(same(call<Str>(row.declaration, row.in), row.want));
  }
}

TEST_F(Text, every_byte_round_trips) {
  const std::string all = all_bytes(20);  // past any first buffer size
  EXPECT_TRUE(same(call<Str>(kToISO, call<Str>(kFromISO, unknown(all))), unknown(all)));
  std::string cp = all;
  for (char& c : cp) {
    const auto b = static_cast<unsigned char>(c);
    if (b == 0x81 || b == 0x8D || b == 0x8F || b == 0x90 || b == 0x9D) c = '\0';
  }
  EXPECT_TRUE(same(call<Str>(kToCP, call<Str>(kFromCP, unknown(all))), unknown(cp)));
}

// Each mark form is the worker's to tell (text/markers_test.cpp); here the
// function must see the stored bytes whole, zero bytes included.
TEST_F(Text, detect_markers) {
  const struct {
    Str in;
    std::int64_t want;
    const char* why;
  } rows[] = {
      {unknown("\xEF\xBB\xBFz"), 1, "UTF-8"},
      {unknown("\xFF\xFE\x00\x00"sv), 7, "UTF-32 LE"},
      {unknown("\x00\x00\xFE\xFF"sv), 6, "UTF-32 BE"},
      {tagged("\xFF\xFE", kLatin1), 4, "stored bytes, whatever the tag"},
      {utf8(""), 0, "empty"},
      {null_string(), 0, "null"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(call<std::int64_t>(kDetect, row.in), row.want);
  }
}

TEST_F(Text, get_markers) {
  const Str utf8_mark = call<Str>(kMarker, std::int64_t{1});
  EXPECT_TRUE(same(utf8_mark, utf8("\xEF\xBB\xBF")));
  EXPECT_EQ(call<std::int64_t>(kDetect, utf8_mark), 1);
  EXPECT_TRUE(same(call<Str>(kMarker, std::int64_t{2}), call<Str>(kMarker, std::int64_t{4})));
  EXPECT_TRUE(same(call<Str>(kMarker, std::int64_t{5}), call<Str>(kMarker, std::int64_t{7})));
  // The UTF-16 and UTF-32 marks come back as whatever the host makes of the
  // lone units; the little-endian ones spell U+FEFF.
  EXPECT_TRUE(same(call<Str>(kMarker, std::int64_t{4}), utf8("\xEF\xBB\xBF")));
  EXPECT_TRUE(same(call<Str>(kMarker, std::int64_t{3}), utf8("\xEF\xBF\xBE")));
  for (const std::int64_t kind : {std::int64_t{0}, std::int64_t{8}, std::int64_t{-1}}) {
    EXPECT_TRUE(same(call<Str>(kMarker, kind), none())) << kind;
  }
}

TEST_F(Text, numbers_as_ASCII_strings) {
  EXPECT_TRUE(same(call<Str>(kScientific, 1234.5, std::int64_t{2}), ascii("1.23e+03")));
  EXPECT_TRUE(
      same(call<Str>(kScientific, -std::numeric_limits<double>::infinity(), std::int64_t{3}),
           ascii("-inf")));
  EXPECT_TRUE(same(call<Str>(kStr, 0.7), ascii("0.70")));
  EXPECT_TRUE(same(call<Str>(kStr, 1000000.1), ascii("1000000.099999999976717")));
  EXPECT_EQ(call<Str>(kScientific, 1.0 / 3, std::int64_t{1000}).bytes.size(), 498u);
}

}  // namespace
