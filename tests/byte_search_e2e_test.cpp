// Byte search end to end: each row calls one registered declaration through
// the stand-in host with the ledger checked after the call.
#include <optional>
#include <string>
#include <vector>

#include "tests/declarations.h"
#include "tests/host_fixture.h"

namespace {

using namespace std::string_view_literals;
using namespace text_encoding;
using zul_host::null_string;
using zul_host::Str;
using zul_host::tagged;
using zul_host::utf8;

const char* const kBytes = decl(58);

using ByteSearch = HostTest;

TEST_F(ByteSearch, first_of_set) {
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
TEST_F(ByteSearch, byte_ranges) {
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
TEST_F(ByteSearch, same_handle_as_both_arguments) {
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
