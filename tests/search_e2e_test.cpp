// Byte search, counting, comparison and distances end to end: each row
// calls one registered declaration through the stand-in host with the
// ledger checked after the call; strings are passed in several stored
// encodings to show which functions read bytes and which read characters.
#include <optional>
#include <string>
#include <vector>

#include "tests/declarations.h"
#include "tests/host_fixture.h"

namespace {

using namespace std::string_view_literals;
using zul_host::null_string;
using zul_host::Str;
using zul_host::tagged;
using zul_host::utf8;
using namespace text_encoding;

const auto kCount = decl(18), kCompBytes = decl(16), kCompChars = decl(17), kJaro = decl(10),
           kEdit = decl(11), kBytes = decl(58);

using Search = HostTest;

TEST_F(Search, count_occurrences) {
  struct {
    Str s, find;
    std::int64_t want;
    const char* why;
  } rows[] = {
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

TEST_F(Search, first_of_set) {
  struct {
    Str target, find;
    std::int64_t want;
    const char* why;
  } rows[] = {
      {utf8("hello world"), utf8("ow"), 5, "the o of hello"},
      {utf8("abc"), utf8("xc"), 3, "last byte"},
      {utf8("abc"), utf8("cba"), 1, "first target byte in the set wins"},
      {utf8("abc"), utf8(""), 0, "empty find"},
      {utf8("abc"), null_string(), 0, "null find"},
      {null_string(), utf8("a"), 0, "null target"},
      {utf8(""), utf8("a"), 0, "empty target"},
      {unknown("a\0b"sv), unknown("\0"sv), 2, "NUL inside a string"},
      {utf8("caf\xC3\xA9"), tagged("\xE9", kLatin1), 0, "bytes as stored, no conversion"},
      {tagged("\x00\x41"sv, kUTF16), utf8("A"), 2, "UTF-16 bytes as stored"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(call<std::int64_t>(kBytes, row.target, row.find), row.want);
  }
}

// Without a find set the range bounds read bytes unsigned (0..255), with one
// signed (-128..127); one to three ranges pick the overload.
TEST_F(Search, byte_ranges) {
  const Str c3 = unknown("\xC3\xA9");
  struct {
    Str target;
    std::optional<Str> find;
    std::vector<std::int64_t> bounds;
    std::int64_t want;
    const char* why;
  } rows[] = {
      {utf8("ab7c1"), {}, {48, 57}, 3, "a digit"},
      {utf8("ab7c1"), {}, {57, 48}, 0, "reversed range is empty"},
      {c3, {}, {128, 255}, 1, "unsigned without find"},
      {c3, {}, {-128, -1}, 0, "negative bounds match nothing unsigned"},
      {utf8("xyz-9"), {}, {48, 57, 45, 45}, 4, "two ranges"},
      {utf8("xyz-9"), {}, {1, 0, 2, 1, 122, 122}, 3, "three ranges, two empty"},
      {null_string(), {}, {0, 255}, 0, "null target"},
      {c3, utf8(""), {128, 255}, 0, "signed with find"},
      {c3, utf8(""), {-128, -1}, 1, "negative bounds match high bytes signed"},
      {utf8("a-b"), utf8("-"), {48, 57}, 2, "the find set alone"},
      {utf8("ab\tc"), utf8("c"), {9, 9, 100, 90}, 3, "two ranges with find"},
      {utf8("abcd"), null_string(), {5, 1, 5, 1, 100, 100}, 4, "three ranges, null find"},
      {utf8(""), utf8("a"), {0, 255, 0, 255, 0, 255}, 0, "empty target"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    const auto& v = row.bounds;
    const int pairs = static_cast<int>(v.size() / 2);
    std::int64_t got = -1;
    if (!row.find) {
      const char* d = decl(58 + pairs);
      got = pairs == 1   ? call<std::int64_t>(d, row.target, v[0], v[1])
            : pairs == 2 ? call<std::int64_t>(d, row.target, v[0], v[1], v[2], v[3])
                         : call<std::int64_t>(d, row.target, v[0], v[1], v[2], v[3], v[4], v[5]);
    } else {
      const char* d = decl(61 + pairs);
      const Str& f = *row.find;
      got = pairs == 1   ? call<std::int64_t>(d, row.target, f, v[0], v[1])
            : pairs == 2 ? call<std::int64_t>(d, row.target, f, v[0], v[1], v[2], v[3])
                         : call<std::int64_t>(d, row.target, f, v[0], v[1], v[2], v[3], v[4], v[5]);
    }
    EXPECT_EQ(got, row.want);
  }
}

// One handle passed as both arguments is locked twice and unlocked twice.
TEST_F(Search, same_handle_as_both_arguments) {
  auto fn = reinterpret_cast<std::int64_t (*)(REALstring, REALstring)>(host_.find(kBytes));
  ASSERT_NE(fn, nullptr);
  host_.begin_ledger();
  REALstring s = host_.make_string("xyz", kUTF8);
  const int locks = host_.service_calls("REALLockString");
  const int unlocks = host_.service_calls("REALUnlockString");
  EXPECT_EQ(fn(s, s), 1);
  EXPECT_EQ(host_.service_calls("REALLockString") - locks, 2);
  EXPECT_EQ(host_.service_calls("REALUnlockString") - unlocks, 2);
  EXPECT_EQ(host_.ref_count(s), 1);
  host_.release(s);
  EXPECT_EQ(host_.ledger_report(), "");
}

}  // namespace
