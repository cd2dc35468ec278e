// Byte search end to end: each row calls one registered declaration through
// the stand-in host with the ledger checked after the call.
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "tests/host_fixture.h"

namespace {

using namespace text_encoding;

using zul_host::Str;
using zul_host::tagged;
using zul_host::utf8;

constexpr const char* kBytes = "InStrBytesZUL(target as string, find as string) as integer";
constexpr const char* kRange1 =
    "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer) as integer";
constexpr const char* kRange2 =
    "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer, StartValue2 "
    "as "
    "integer, EndValue2 as integer) as integer";
constexpr const char* kRange3 =
    "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer, StartValue2 "
    "as "
    "integer, EndValue2 as integer, StartValue3 as integer, EndValue3 as integer) as integer";
constexpr const char* kRange1B =
    "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as "
    "integer) as integer";
constexpr const char* kRange2B =
    "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as "
    "integer, StartValue2 as integer, EndValue2 as integer) as integer";
constexpr const char* kRange3B =
    "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as "
    "integer, StartValue2 as integer, EndValue2 as integer, StartValue3 as integer, EndValue3 as "
    "integer) as integer";

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
      {utf8("abc"), zul_host::null_string(), 0, "null find"},
      {zul_host::null_string(), utf8("a"), 0, "null target"},
      {utf8(""), utf8("a"), 0, "empty target"},
      {tagged(std::string("a\0b", 3), text_encoding::kUnknown),
       tagged(std::string(1, '\0'), text_encoding::kUnknown), 2, "NUL inside a string"},
      {utf8("caf\xC3\xA9"), tagged("\xE9", text_encoding::kLatin1), 0,
       "bytes as stored, no conversion"},
      {tagged(std::string("\x00\x41", 2), text_encoding::kUTF16), utf8("A"), 2,
       "UTF-16 bytes as stored"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(call<std::int64_t>(kBytes, row.target, row.find), row.want);
  }
}

TEST_F(ByteSearch, ranges_without_find_read_bytes_unsigned) {
  const Str c3 = tagged("\xC3\xA9", text_encoding::kUnknown);
  EXPECT_EQ(call<std::int64_t>(kRange1, utf8("ab7c1"), std::int64_t{48}, std::int64_t{57}), 3);
  EXPECT_EQ(call<std::int64_t>(kRange1, utf8("ab7c1"), std::int64_t{57}, std::int64_t{48}), 0);
  EXPECT_EQ(call<std::int64_t>(kRange1, c3, std::int64_t{128}, std::int64_t{255}), 1);
  EXPECT_EQ(call<std::int64_t>(kRange1, c3, std::int64_t{-128}, std::int64_t{-1}), 0);
  EXPECT_EQ(call<std::int64_t>(kRange2, utf8("xyz-9"), std::int64_t{48}, std::int64_t{57},
                               std::int64_t{45}, std::int64_t{45}),
            4);
  EXPECT_EQ(
      call<std::int64_t>(kRange3, utf8("xyz-9"), std::int64_t{1}, std::int64_t{0}, std::int64_t{2},
                         std::int64_t{1}, std::int64_t{122}, std::int64_t{122}),
      3);
  EXPECT_EQ(
      call<std::int64_t>(kRange1, zul_host::null_string(), std::int64_t{0}, std::int64_t{255}), 0);
}

TEST_F(ByteSearch, ranges_with_find_read_bytes_signed) {
  const Str c3 = tagged("\xC3\xA9", text_encoding::kUnknown);
  const Str empty = utf8("");
  EXPECT_EQ(call<std::int64_t>(kRange1B, c3, empty, std::int64_t{128}, std::int64_t{255}), 0);
  EXPECT_EQ(call<std::int64_t>(kRange1B, c3, empty, std::int64_t{-128}, std::int64_t{-1}), 1);
  EXPECT_EQ(
      call<std::int64_t>(kRange1B, utf8("a-b"), utf8("-"), std::int64_t{48}, std::int64_t{57}), 2);
  EXPECT_EQ(call<std::int64_t>(kRange2B, utf8("ab\tc"), utf8("c"), std::int64_t{9}, std::int64_t{9},
                               std::int64_t{100}, std::int64_t{90}),
            3);
  EXPECT_EQ(call<std::int64_t>(kRange3B, utf8("abcd"), zul_host::null_string(), std::int64_t{5},
                               std::int64_t{1}, std::int64_t{5}, std::int64_t{1}, std::int64_t{100},
                               std::int64_t{100}),
            4);
  EXPECT_EQ(
      call<std::int64_t>(kRange3B, utf8(""), utf8("a"), std::int64_t{0}, std::int64_t{255},
                         std::int64_t{0}, std::int64_t{255}, std::int64_t{0}, std::int64_t{255}),
      0);
}

// One handle passed as both arguments is locked twice and unlocked twice.
TEST_F(ByteSearch, same_handle_as_both_arguments) {
  auto fn = reinterpret_cast<std::int64_t (*)(REALstring, REALstring)>(host_.find(kBytes));
  ASSERT_NE(fn, nullptr);
  host_.begin_ledger();
  REALstring s = host_.make_string("xyz", text_encoding::kUTF8);
  const int locks = host_.service_calls("REALLockString");
  const int unlocks = host_.service_calls("REALUnlockString");
  EXPECT_EQ(fn(s, s), 1);
  EXPECT_EQ(host_.service_calls("REALLockString") - locks, 2);
  EXPECT_EQ(host_.service_calls("REALUnlockString") - unlocks, 2);
  EXPECT_EQ(host_.ref_count(s), 1);
  host_.release(s);
  EXPECT_EQ(host_.ledger_report(), "");
}

// Several host threads call at once; every call sees only its own data.
TEST_F(ByteSearch, concurrent_calls) {
  std::vector<std::thread> threads;
  std::vector<int> wrong(4, 0);
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&, t] {
      const std::string target = std::string(100 + t, 'a') + "!";
      for (int i = 0; i < 200; ++i) {
        if (host_.call<std::int64_t>(kBytes, utf8(target), utf8("!?")) != 101 + t) ++wrong[t];
      }
    });
  }
  for (auto& thread : threads) thread.join();
  EXPECT_EQ(wrong, std::vector<int>(4, 0));
}

}  // namespace
