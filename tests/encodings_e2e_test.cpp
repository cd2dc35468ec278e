// Web, mail and database encodings end to end: each row calls a registered
// declaration through the stand-in host (ledger checked after every call)
// and checks the result's bytes and the encoding it carries.
#include <optional>
#include <string>
#include <thread>
#include <vector>

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

const auto kURL1 = decl(34), kURL2 = decl(35), kUnURL1 = decl(36), kUnURL2 = decl(37),
           kHTML = decl(30), kUnHTML = decl(31), kXML = decl(32), kUnXML = decl(33),
           kHTMLready = decl(21), kXMLready = decl(22), kQP = decl(38), kUnQP = decl(39),
           kSubject = decl(7), kYencS = decl(9), kYencM = decl(8), kTags = decl(50),
           kTagsWith = decl(51), kMySQL = decl(29), kBoolean = decl(57);

using Encodings = HostTest;

// One call of a string function: with options when the declaration has them.
struct call_row {
  const char* declaration;
  Str in;
  std::optional<std::int64_t> options;
  Str want;
  const char* why;
};

const call_row kRows[] = {
    {kURL2, utf8("a b+c"), 0, ascii("a%20b+c"), "url options 0"},
    {kURL2, utf8("a b+c"), 1, ascii("a+b%2Bc"), "url options 1"},
    {kURL2, utf8("a b+c"), 2, ascii("a%20b%2Bc"), "url options 2"},
    {kURL2, utf8("a b+c"), 7, ascii("a%20b+c"), "url options 7 as 3"},
    {kURL1, utf8("a b+c"), {}, ascii("a%20b+c"), "url without options"},
    {kURL1, tagged("\xE9", kLatin1), {}, ascii("%E9"), "url bytes as stored"},
    {kURL1, utf8(""), {}, none(), "url empty"},
    {kURL2, null_string(), 1, none(), "url null"},
    {kUnURL1, utf8("%41%4a"), {}, ascii("AJ"), "unurl ASCII result"},
    {kUnURL1, utf8("%C3%A9"), {}, unknown("\xC3\xA9"), "unurl high bytes carry no encoding"},
    {kUnURL2, utf8("a+b"), 3, ascii("a b"), "unurl plus as space"},
    {kUnURL2, utf8(""), 1, none(), "unurl empty"},
    {kHTML, utf8("Tom & Jerry's <b>"), 0, ascii("Tom &amp; Jerry&#39;s &lt;b&gt;"), "html markup"},
    {kHTML, utf8("Tom & Jerry's <b>"), 1, ascii("Tom & Jerry's <b>"), "html markup kept"},
    {kHTML, tagged("caf\xE9", kLatin1), 1, ascii("caf&eacute;"), "html read as characters"},
    {kHTML, tagged("\x3D\xD8\x00\xDE"sv, kUTF16), 0, ascii("&#128512;"), "html surrogate pair"},
    {kHTML, utf8("a\0<"sv), 0, ascii("a&lt;"), "html: a zero does not end the check"},
    {kHTML, tagged("a \x01 b", kWindowsLatin1), 0, tagged("a \x01 b", kWindowsLatin1),
     "html same string"},
    {kHTML, utf8("\xEF\xBB\xBF"), 0, none(), "html byte-order mark only"},
    {kHTML, utf8(""), 0, none(), "html empty"},
    {kXML, utf8("it's"), 0, utf8("it&#39;s"), "xml apostrophe, options 0"},
    {kXML, utf8("it's"), 3, utf8("it&apos;s"), "xml apostrophe, options 3"},
    {kXML, tagged("\xE9 & \x07", kLatin1), 0, utf8("\xC3\xA9 &amp; "),
     "xml non-ASCII kept, control dropped"},
    {kXML, utf8("\xE6\x97\xA5\x07"), 0, utf8("\xE6\x97\xA5\x07"), "xml same string"},
    {kXML, null_string(), 1, none(), "xml null"},
    {kUnHTML, utf8("&thetasym;&lt;&#x41;&#X41;"), {}, utf8("\xCF\x91<A&#X41;"), "unhtml"},
    {kUnXML, utf8("&thetasym;&lt;&#x41;&#X41;"), {}, utf8("\xCF\x91<A&#X41;"), "unxml is unhtml"},
    {kUnHTML, tagged("&eacute;\xE9 &amp", kLatin1), {}, utf8("\xC3\xA9\xC3\xA9 &"), "Latin-1"},
    {kUnXML, utf8(""), {}, none(), "unxml empty"},
    {kQP, utf8("Gr\xC3\xBC\xC3\x9F.=\t"), 72, ascii("Gr=C3=BC=C3=9F.=3D\t"), "qp"},
    {kQP, utf8("ab"), 2, ascii("=\r\na=\r\nb"), "qp line length 2"},
    {kQP, utf8(""), 72, none(), "qp empty"},
    {kUnQP, utf8("=c3=a9= x\r\n."), {}, ascii("\xC3\xA9."), "unqp high bytes marked ASCII"},
    {kUnQP, utf8("=4G"), {}, none(), "unqp nothing written"},
    {kSubject, tagged("Hi =?_", kWindowsLatin1), {}, tagged("Hi =?_", kWindowsLatin1), "subject"},
    {kSubject, tagged("Caf\xE9?", kLatin1), {}, ascii("=?utf-8?Q?Caf=C3=A9=3F?="), "subject UTF-8"},
    {kSubject, utf8("a b_c=d\t"), {}, ascii("=?utf-8?Q?a_b=5Fc=3Dd=09?="), "subject tab encoded"},
    {kSubject, utf8("a\0b\x7F"sv), {}, ascii("=?utf-8?Q?a=00b=7F?="), "subject zero byte"},
    {kSubject, null_string(), {}, none(), "subject null"},
    {kSubject, utf8(""), {}, utf8(""), "subject empty: the same string"},
    {kYencS, utf8("rst*"), {}, ascii("HIJ\0"sv), "yenc ASCII result"},
    {kYencS, utf8("=@=}a="), {}, unknown("\xD6\x13\x37\x96"), "yenc escapes and a final ="},
    {kYencS, utf8(""), {}, none(), "yenc empty"},
    {kTags, utf8("<b>bold</b> x<a<b>>y"), {}, utf8("bold xy"), "tags nested"},
    {kTags, tagged("\xE9<i>\xFC</i>", kLatin1), {}, utf8("\xC3\xA9\xC3\xBC"), "tags Latin-1"},
    {kTags, utf8("<p>\0"sv), {}, none(), "tags nothing left"},
    {kMySQL, utf8("It\\'s \\\\n\\x\\Z\\"), {}, ascii("It's \\n\\x\x1A\\"), "mysql"},
    {kMySQL, utf8("\xC3\xA9\\0"), {}, unknown("\xC3\xA9\0"sv), "mysql high bytes"},
    {kMySQL, utf8(""), {}, none(), "mysql empty"},
    {kBoolean, utf8("a = true AND b = FALSE OR c"), {}, utf8("a = 1 AND b = 0 OR c"), "sql"},
    {kBoolean, tagged("(true, false) \xE9", kLatin1), {}, utf8("(1, 0) \xC3\xA9"), "sql Latin-1"},
    {kBoolean, utf8("\0true x"sv), {}, none(), "sql cut at a zero byte"},
};

TEST_F(Encodings, string_functions) {
  for (const auto& row : kRows) {
    SCOPED_TRACE(row.why);
    const Str got = row.options ? call<Str>(row.declaration, row.in, *row.options)
                                : call<Str>(row.declaration, row.in);
    EXPECT_TRUE(same(got, row.want));
  }
}

TEST_F(Encodings, round_trips_of_every_byte_past_the_reserves) {
  const std::string all = all_bytes(300);
  for (const std::int64_t options : {0, 1, 2}) {
    SCOPED_TRACE(options);
    EXPECT_TRUE(same(call<Str>(kUnURL2, call<Str>(kURL2, tagged(all, kUnknown), options), options),
                     unknown(all)));
  }
  std::string no_breaks;
  for (const char c : all) {
    if (c != '\r' && c != '\n') no_breaks += c;
  }
  EXPECT_TRUE(same(call<Str>(kUnQP, call<Str>(kQP, tagged(no_breaks, kUnknown), std::int64_t{76})),
                   ascii(no_breaks)));
  std::string text;
  while (text.size() < 70000) text += "Tom & Jerry's <caf\xC3\xA9> \xE2\x82\xAC \xF0\x9F\x98\x80 ";
  EXPECT_TRUE(same(call<Str>(kUnHTML, call<Str>(kHTML, utf8(text), std::int64_t{0})), utf8(text)));
  EXPECT_TRUE(same(call<Str>(kUnXML, call<Str>(kXML, utf8(text), std::int64_t{1})), utf8(text)));
}

// Calls with different options at once never see each other's choice.
TEST_F(Encodings, url_options_are_per_call_across_threads) {
  std::vector<std::thread> threads;
  std::vector<int> wrong(4, 0);
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&, t] {
      const std::int64_t options = t % 2;
      const std::string want = options ? "a+b%2Bc" : "a%20b+c";
      for (int i = 0; i < 200; ++i) {
        if (host_.call<Str>(kURL2, utf8("a b+c"), options).bytes != want) ++wrong[t];
      }
    });
  }
  for (auto& thread : threads) thread.join();
  EXPECT_EQ(wrong, std::vector<int>(4, 0));
}

TEST_F(Encodings, readiness) {
  const struct {
    Str in;
    bool want;
    const char* why;
  } rows[] = {
      {utf8("Hello"), true, "plain"},
      {tagged("Hello", kMacRoman), true, "Mac OS Roman"},
      {utf8("a&b"), false, "ampersand"},
      {utf8("x>1"), false, "greater-than"},
      {utf8("\""), false, "double quote"},
      {utf8("\x7F\x01"), true, "DEL and 1"},
      {utf8("it's"), false, "apostrophe"},
      {utf8("caf\xC3\xA9"), false, "byte above 127"},
      {utf8("a\0b"sv), false, "zero byte"},
      {tagged("Hello", kUTF16), false, "UTF-16 encoding"},
      {tagged("Hello", kLatin1), false, "ISO Latin 1 encoding"},
      {utf8(""), true, "empty"},
      {tagged("", kUTF16), true, "empty UTF-16: nothing to escape, the tag does not matter"},
      {tagged("", kLatin1), true, "empty ISO Latin 1"},
      {null_string(), true, "null"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(call<bool>(kHTMLready, row.in), row.want);
    EXPECT_EQ(call<bool>(kXMLready, row.in), row.want);
  }
}

// When the host cannot give a subject's UTF-8 form there is nothing a mail
// header could carry: the result is null, with nothing raised, rather than
// the stored UTF-16 or UTF-32 bytes.
TEST_F(Encodings, subject_without_a_utf8_form_is_null) {
  const struct {
    Str in;
    const char* why;
  } rows[] = {
      {utf16(u"ab\xD800"), "lone high surrogate in UTF-16"},
      {utf16(u"\xDC00x"), "lone low surrogate in UTF-16"},
      {tagged("a\0b"sv, kUTF16), "odd-length UTF-16"},
      {tagged("\x00\x00\x11\x00"sv, kUTF32), "UTF-32 past U+10FFFF"},
      {tagged("a\0\0\0b"sv, kUTF32), "UTF-32 of 5 bytes"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_TRUE(same(call<Str>(kSubject, row.in), none()));
    EXPECT_FALSE(raised());
  }
  // The same texts well formed are encoded as usual.
  EXPECT_TRUE(same(call<Str>(kSubject, utf16(u"ab\x00E9")), ascii("=?utf-8?Q?ab=C3=A9?=")));
  EXPECT_TRUE(
      same(call<Str>(kSubject, tagged("\xE9\0\0\0"sv, kUTF32)), ascii("=?utf-8?Q?=C3=A9?=")));
}

TEST_F(Encodings, yenc_memory_block_matches_the_string_variant) {
  const std::string all = all_bytes();
  const Block from_block = call<Block>(kYencM, Block{all});
  EXPECT_FALSE(from_block.null);
  EXPECT_EQ(from_block.bytes, call<Str>(kYencS, tagged(all, kUnknown)).bytes);
  EXPECT_EQ(from_block.bytes.size(), 255u);  // "=" takes the byte after it
  EXPECT_TRUE(call<Block>(kYencM, Block{""}).null);
}

zul_host::HostConfig small_blocks() {
  zul_host::HostConfig config;
  config.block_cap = 4;
  return config;
}
using SmallBlocks = HostTestWith<small_blocks>;

TEST_F(SmallBlocks, yenc_memory_block_that_cannot_be_made) {
  EXPECT_TRUE(call<Block>(kYencM, Block{"rstuvwxyz"}).null);
  ASSERT_TRUE(raised().has_value());
  EXPECT_EQ(raised()->class_name, "OutOfMemoryException");
  EXPECT_EQ(raised()->message, "Failed to allocate a memoryblock with 9 bytes in size.");
}

TEST_F(Encodings, tags_with_a_replacement) {
  const struct {
    Str in, replacement, want;
    const char* why;
  } rows[] = {
      {utf8("a<br>b"), utf8("-"), utf8("a--b"), "once per byte inside"},
      {utf8("a<\xC3\xA9>b"), tagged("*", kASCII), utf8("a**b"), "UTF-8 bytes inside"},
      {utf8("a<\xC3\xA9>b"), tagged("\xE9", kLatin1),
       utf8("a\xC3\xA9\xC3\xA9"
            "b"),
       "replacement as UTF-8"},
      {utf8("<b>x</b>"), utf8(""), utf8("x"), "empty replacement"},
      {null_string(), utf8("-"), none(), "null"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_TRUE(same(call<Str>(kTagsWith, row.in, row.replacement), row.want));
  }
}

}  // namespace
