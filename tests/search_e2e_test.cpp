// Counting, comparison and distances end to end: each row calls one
// registered declaration through the stand-in host with the ledger checked
// after the call; strings are passed in several stored encodings to show
// which functions read bytes and which read characters.
#include <string>

#include "tests/declarations.h"
#include "tests/host_fixture.h"

namespace {

using zul_host::null_string;
using zul_host::Str;
using zul_host::tagged;
using zul_host::utf8;
using namespace text_encoding;

const auto kCount = decl(18), kCompBytes = decl(16), kCompChars = decl(17), kJaro = decl(10),
           kEdit = decl(11);

using Search = HostTest;

TEST_F(Search, count_occurrences) {
  struct {
    Str s, find;
    std::int64_t want;
    const char* why;
  } rows[] = {
      {utf8("aaaa"), utf8("aa"), 2, "no overlaps"},
      {utf8("aaa"), utf8("aa"), 1, "leftmost wins"},
      {utf8("ab"), utf8("abc"), 0, "find longer than s"},
      {utf8("abc"), null_string(), 0, "null find"},
      {utf8("abc"), utf8(""), 0, "empty find"},
      {null_string(), utf8("a"), 0, "null s"},
      {utf8("abc"), utf8("abc"), 1, "find equal to s"},
      {utf8("caf\xC3\xA9"), tagged("\xE9", kLatin1), 0, "stored bytes, no conversion"},
      {utf16(u"aXa"), utf8("a"), 2, "UTF-16 bytes as stored"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(call<std::int64_t>(kCount, row.s, row.find), row.want);
  }
}

TEST_F(Search, compare_bytes_and_characters) {
  struct {
    Str a, b;
    std::int64_t bytes, characters;
    const char* why;
  } rows[] = {
      {utf8("abc"), utf8("abd"), -1, -1, "first difference"},
      {utf8("b"), utf8("abc"), 1, 1, "first byte beats length"},
      {utf8("ab"), utf8("abc"), -1, -1, "prefix first"},
      {utf8("abc"), utf8("abc"), 0, 0, "equal"},
      {utf8(""), null_string(), 0, 0, "empty and null"},
      {null_string(), utf8("x"), -1, -1, "null before text"},
      {utf8("x"), null_string(), 1, 1, "text after null"},
      {tagged("\xE9", kLatin1), tagged("A", kLatin1), 1, 1, "unsigned bytes"},
      {tagged(std::string("ab\0", 3), kUTF8), utf8("ab"), 0, 0, "trailing zero byte"},
      {utf8("caf\xC3\xA9"), utf16(u"caf\u00E9"), 1, 0, "same text, UTF-8 and UTF-16"},
      {utf16(u"\u0100"), utf16(u"\u0001"), -1, -1,
       "equal encodings: stored bytes, not code points"},
      {utf8("\xC4\x80"), utf16(u"\u0001"), 1, 1, "different encodings: code points"},
      {tagged("\xE9", kLatin1), utf8("\xC3\xA9"), 1, 0, "Latin-1 against UTF-8"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(call<std::int64_t>(kCompBytes, row.a, row.b), row.bytes);
    EXPECT_EQ(call<std::int64_t>(kCompChars, row.a, row.b), row.characters);
  }
}

TEST_F(Search, distances_read_code_points) {
  struct {
    Str a, b;
    double jaro, edit;
    const char* why;
  } rows[] = {
      {null_string(), utf8(""), 0.0, 1.0, "two empty texts"},
      {utf8(""), utf8("abc"), 1.0, 1.0, "empty against text"},
      {utf8("abc"), null_string(), 1.0, 1.0, "text against null"},
      {utf8("MARTHA"), utf8("MARHTA"), 0.038888888888888862, 1.0 / 6.0, "one swap"},
      {utf8("CRATE"), utf8("TRACE"), 0.26666666666666672, 0.4, "window 1"},
      {utf8("abcdef"), utf8("bcadef"), 1.0 / 18.0, 2.0 / 6.0, "three crossed pairs: t = 1"},
      {utf8("TRAINS"), utf8("TWAINS"), 1.0 - (8.0 / 9.0 + (1.0 / 9.0) * 0.1), 1.0 / 6.0,
       "prefix 1"},
      {utf8("abcdefgh"), utf8("abcdefgx"), 1.0 - (11.0 / 12.0 + (1.0 / 12.0) * 0.4), 1.0 / 8.0,
       "prefix capped at 4"},
      {utf8("flaw"), utf8("lawn"), 1.0 - (1.0 + 0.75 + 0.75) / 3.0, 0.5, "edit distance 2"},
      {utf8("a"), utf8("bcdef"), 1.0, 5.0, "scaled by the shorter text"},
      {utf8("caf\xC3\xA9"), utf16(u"caf\u00E9"), 0.0, 0.0, "same text, UTF-8 and UTF-16"},
      {tagged("caf\xE9", kLatin1), utf8("caf\xC3\xA9"), 0.0, 0.0, "Latin-1 and UTF-8"},
      {utf8("\xF0\x9F\x98\x80x"), utf16(u"x\U0001F600"), 1.0, 0.5, "non-BMP swap counts one"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_NEAR(call<double>(kJaro, row.a, row.b), row.jaro, 1e-12);
    EXPECT_NEAR(call<double>(kEdit, row.a, row.b), row.edit, 1e-12);
    EXPECT_FALSE(raised());
  }
}

}  // namespace
