// Byte-order marks, encoding normalisation, ISO 8859-1 / Windows-1252 and
// number formatting end to end: each row calls a registered declaration
// through the stand-in host (ledger checked after every call) and checks the
// result's bytes and the encoding it carries.
#include <cstdint>
#include <limits>
#include <string>
#include <string_view>

#include "tests/declarations.h"
#include "tests/host_fixture.h"

namespace {

using namespace std::string_view_literals;
using zul_host::null_string;
using zul_host::Str;
using zul_host::tagged;
using zul_host::utf8;
using namespace text_encoding;

const auto kDetect = decl(19), kMarker = decl(20), kUnicode = decl(27), kNative = decl(28),
           kToISO = decl(41), kFromISO = decl(42), kToCP = decl(43), kFromCP = decl(44),
           kScientific = decl(12), kStr = decl(13);

using TextConvert = HostTest;

TEST_F(TextConvert, string_functions) {
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

TEST_F(TextConvert, every_byte_round_trips) {
  std::string all;
  for (int round = 0; round < 20; ++round) {  // past any first buffer size
    for (int b = 0; b < 256; ++b) all += static_cast<char>(b);
  }
  EXPECT_TRUE(same(call<Str>(kToISO, call<Str>(kFromISO, unknown(all))), unknown(all)));
  std::string cp = all;
  for (char& c : cp) {
    const auto b = static_cast<unsigned char>(c);
    if (b == 0x81 || b == 0x8D || b == 0x8F || b == 0x90 || b == 0x9D) c = '\0';
  }
  EXPECT_TRUE(same(call<Str>(kToCP, call<Str>(kFromCP, unknown(all))), unknown(cp)));
}

TEST_F(TextConvert, detect_markers) {
  const struct {
    Str in;
    std::int64_t want;
    const char* why;
  } rows[] = {
      {unknown("\xEF\xBB\xBFz"), 1, "UTF-8"},
      {unknown("\xEF\xBB"), 0, "UTF-8 cut short"},
      {unknown("\xFF\xFE"), 4, "UTF-16 LE"},
      {unknown("\xFF\xFE\x00"sv), 4, "UTF-16 LE, three bytes"},
      {unknown("\xFF\xFE\x00\x00"sv), 7, "UTF-32 LE"},
      {unknown("\xFF\xFE\x00\x01"sv), 4, "UTF-16 LE then text"},
      {unknown("\xFE\xFF\x00\x41"sv), 3, "UTF-16 BE"},
      {unknown("\x00\x00\xFE\xFF"sv), 6, "UTF-32 BE"},
      {unknown("\x00\x00\x00\x41"sv), 0, "no mark"},
      {tagged("\xFF\xFE", kLatin1), 4, "stored bytes, whatever the tag"},
      {unknown("\xFF"), 0, "single byte"},
      {utf8(""), 0, "empty"},
      {null_string(), 0, "null"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(call<std::int64_t>(kDetect, row.in), row.want);
  }
}

TEST_F(TextConvert, get_markers) {
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

TEST_F(TextConvert, numbers_as_ASCII_strings) {
  EXPECT_TRUE(same(call<Str>(kScientific, 1234.5, std::int64_t{2}), ascii("1.23e+03")));
  EXPECT_TRUE(
      same(call<Str>(kScientific, -std::numeric_limits<double>::infinity(), std::int64_t{3}),
           ascii("-inf")));
  EXPECT_TRUE(same(call<Str>(kStr, 0.7), ascii("0.70")));
  EXPECT_TRUE(same(call<Str>(kStr, 1000000.1), ascii("1000000.099999999976717")));
  EXPECT_EQ(call<Str>(kScientific, 1.0 / 3, std::int64_t{1000}).bytes.size(), 498u);
}

}  // namespace
