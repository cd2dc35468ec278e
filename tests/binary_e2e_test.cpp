// Binary strings end to end: each row calls a registered declaration through
// the stand-in host (ledger checked after every call) and checks the result's
// bytes and the encoding it carries, or the elements of a string array.
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "tests/declarations.h"
#include "tests/host_fixture.h"

namespace {

using namespace std::string_view_literals;
using namespace text_encoding;
using zul_host::Block;
using zul_host::Str;
using zul_host::StrArray;
using zul_host::tagged;
using zul_host::utf8;

const char *kRunsP = decl(1), *kRunsM = decl(2), *kRunsS = decl(3), *kRandom = decl(14),
           *kCreate = decl(15), *kAND = decl(23), *kOR = decl(24), *kXOR = decl(25),
           *kXOR2 = decl(26), *kDump = decl(40), *kToHex = decl(45), *kFromHex = decl(46),
           *kConcat6 = decl(52), *kConcat3 = decl(55), *kConcat2 = decl(56);

const Str none = zul_host::null_string();
Str raw(std::string_view bytes) { return tagged(bytes, kUnknown); }

// One call, made as the table is built, and the result it must give.
struct row {
  Str got, want;
  const char* why;
};
void check(std::initializer_list<row> rows) {
  for (const row& r : rows) EXPECT_TRUE(same(r.got, r.want)) << r.why;
}

using Binary = HostTest;
const std::int64_t k0 = 0, k1 = 1, k2 = 2, k3 = 3, k4 = 4, k5 = 5, k16 = 16;

TEST_F(Binary, bitwise) {
  const Str zeros = raw("\0\0\0\0\0"sv), m123 = raw("\x01\x02\x03");
  check({
      {call<Str>(kAND, utf8("ABCD"), raw("\x0F")), ascii("\x01\x02\x03\x04"), "and, 1-byte mask"},
      {call<Str>(kAND, utf8("ABCD"), raw("\x0F\xF0")), ascii("\x01\x40\x03\x40"), "and, 2 bytes"},
      {call<Str>(kOR, raw("\x01\x02\x03"), utf8("0123456789")), ascii("133"), "or, mask cut"},
      {call<Str>(kOR, utf8("a"), raw("\x80")), raw("\xE1"), "high byte: no encoding"},
      {call<Str>(kXOR, zeros, m123, k1), ascii("\x02\x03\x01\x02\x03"), "offset 1 wraps to 0"},
      {call<Str>(kXOR, zeros, m123, std::int64_t{7}), ascii("\x02\x03\x01\x02\x03"), "7 is 1"},
      {call<Str>(kXOR, zeros, m123, -k1), ascii("\x03\x01\x02\x03\x01"), "-1: last mask byte"},
      {call<Str>(kXOR, zeros, m123, INT64_MIN), ascii("\x02\x03\x01\x02\x03"), "floored"},
      {call<Str>(kXOR2, raw("\0\0\0"sv), raw("\0"sv), k0), ascii("\0\x01\x02"sv), "positions"},
      {call<Str>(kAND, none, utf8("a")), none, "null data"},
      {call<Str>(kOR, utf8("a"), none), none, "null mask"},
      {call<Str>(kXOR, utf8("abc"), utf8(""), k1), none, "empty mask"},
  });
  EXPECT_EQ(call<Str>(kXOR2, raw(std::string(300, '\0')), raw("\0"sv), k0).bytes[256], 0);
  std::string all;
  for (int b = 0; b < 256 * 3; ++b) all += static_cast<char>(b * 7);
  for (const char* xor_decl : {kXOR, kXOR2}) {
    const Str once = call<Str>(xor_decl, raw(all), utf8("secret"), k4);
    check({{call<Str>(xor_decl, once, utf8("secret"), k4), raw(all), "twice gives data back"}});
  }
}

TEST_F(Binary, concat_create_random) {
  check({
      {call<Str>(kConcat2, utf8("\xC3\xA9"), tagged("A", kLatin1)),
       raw("\xC3\xA9"
           "A"),
       "bytes"},
      {call<Str>(kConcat3, utf8("a"), none, utf8("b")), ascii("ab"), "null counts as empty"},
      {call<Str>(kConcat6, utf8("a"), utf8("b"), utf8(""), utf8("d"), utf8("e"), utf8("f")),
       ascii("abdef"), "six"},
      {call<Str>(kConcat2, none, utf8("")), none, "all empty"},
      {call<Str>(kCreate, k5, utf8("ab")), utf8("ababa"), "repeated"},
      {call<Str>(kCreate, k3, utf8("")), utf8("\0\0\0"sv), "empty content"},
      {call<Str>(kCreate, k2, none), ascii("\0\0"sv), "null content"},
      {call<Str>(kCreate, k3, utf8("\xC3\xA9")), utf8("\xC3\xA9\xC3"), "cut in a character"},
      {call<Str>(kCreate, k2, tagged("x", kWindowsLatin1)), ascii("xx"), "ASCII bytes"},
      {call<Str>(kCreate, -k1, utf8("ab")), none, "negative length"},
      {call<Str>(kCreate, std::int64_t{1} << 40, utf8("ab")), none, "over the length limit"},
      {call<Str>(kRandom, k0, false), none, "no random bytes"},
  });
  EXPECT_FALSE(raised());
  check({{call<Str>(kCreate, INT64_MAX, utf8("ab")), none, "buffer size overflows"}});
  ASSERT_TRUE(raised());
  EXPECT_EQ(*raised(),
            (zul_host::RaisedException{"OutOfMemoryException", "Failed to allocate memory.", 0}));
  const Str text = call<Str>(kRandom, std::int64_t{4000}, true);
  EXPECT_EQ(text.encoding, kASCII);
  ASSERT_EQ(text.bytes.size(), 4000u);
  for (unsigned char c : text.bytes) ASSERT_TRUE(c >= 0x20 && c <= 0x7F) << int{c};
}

TEST_F(Binary, hex) {
  const std::string all = all_bytes();
  check({
      {call<Str>(kToHex, raw("\x00\x7F\x80\xFF"sv)), ascii("007F80FF"), "upper case"},
      {call<Str>(kToHex, tagged("\xE9", kLatin1)), ascii("E9"), "stored bytes, not characters"},
      {call<Str>(kToHex, utf8("")), none, "empty"},
      {call<Str>(kFromHex, utf8("48656c6c6F")), ascii("Hello"), "mixed case"},
      {call<Str>(kFromHex, utf8("41 42")), ascii("\x41\x04"), "a space is digit 0, pairs shift"},
      {call<Str>(kFromHex, utf8("4GG4/:@`gf")), ascii("\x40\x04\0\0\x0F"sv), "non-digits count 0"},
      {call<Str>(kFromHex, utf8("FF0")), raw("\xFF"), "odd digit dropped, high byte"},
      {call<Str>(kFromHex, tagged("4\0"
                                  "1\0"sv,
                                  kUTF16)),
       ascii("A"), "read as ASCII text"},
      {call<Str>(kFromHex, utf8("4")), none, "one digit"},
      {call<Str>(kFromHex, call<Str>(kToHex, raw(all))), raw(all), "round trip"},
  });
}

TEST_F(Binary, hex_dump) {
  const Str e = utf8(""), lf = utf8("\n"), sp = utf8(" "), abc = utf8("ABC");
  std::string x16;
  for (int g = 0; g < 16; ++g) x16 += "78";
  const Str b17 = utf8(std::string(16, 'x') + "y");
  check({
      {call<Str>(kDump, abc, k2, k2, e, lf, sp, e), ascii("41 42\n43 00\n"), "default filler"},
      {call<Str>(kDump, abc, k2, k2, none, lf, sp, utf8(".")), ascii("41 42\n43 ..\n"), "period"},
      {call<Str>(kDump, abc, k2, k2, e, lf, sp, utf8("  ")), ascii("41 42\n43   \n"), "2 spaces"},
      {call<Str>(kDump, raw("\x01\x02\x03"), k4, k1, utf8("0x"), lf, utf8(","), none),
       ascii("0x0102\n0x0300\n"), "one group a line"},
      {call<Str>(kDump, raw("\xAB"), k1, k4, e, e, sp, e), ascii("A B 0 0"), "nibble groups"},
      {call<Str>(kDump, utf8("A"), k2, k1, e, utf8("\xC3\xA9"), sp, e), ascii("41\xC3\xA9"),
       "non-ASCII line end, still ASCII"},
      {call<Str>(kDump, b17, k2, k16, e, lf, e, e),
       ascii(x16 + "\n79" + std::string(30, '0') + "\n"), "17 bytes: fifteen filler groups"},
      {call<Str>(kDump, abc, k0, k2, e, lf, sp, e), none, "hexlen 0"},
      {call<Str>(kDump, abc, k2, -k2, e, lf, sp, e), none, "negative linelen"},
      {call<Str>(kDump, e, k2, k2, e, lf, sp, e), none, "empty input"},
      {call<Str>(kDump, abc, INT64_MAX, k2, e, lf, sp, e), none, "size overflows"},
      {call<Str>(kDump, abc, k1 << 16, k1 << 16, e, lf, sp, e), none, "2^32 characters"},
  });
  EXPECT_FALSE(raised());
}

TEST_F(Binary, readable_runs_from_every_source) {
  const struct {
    std::string_view data;
    std::int64_t min_length;
    std::vector<std::string> want;
    const char* why;
  } rows[] = {
      {"Hello\0World"sv, 0, {"Hello", "World"}, "two runs"},
      {"Hello\0World"sv, 5, {}, "both exactly MinLength: empty array"},
      {"  \0\tA\n"sv, -4, {"\tA\n"}, "blank run dropped, not trimmed, negative MinLength"},
      {"Gr\xC3\xBC\xC3\x9F"
       "e",
       6,
       {"Gr\xC3\xBC\xC3\x9F"
        "e"},
       "MinLength counts bytes"},
      {"A\xC3(B\xED\xA0\x80 \xC0\xAF", 0, {"A", "(B"}, "bad continuation, surrogate, overlong"},
      {"ab\xE2\x82", 0, {"ab"}, "data ends inside a character"},
  };
  for (const auto& row : rows) {
    const std::string data(row.data);
    const StrArray arrays[] = {
        call<StrArray>(kRunsS, raw(data), row.min_length),
        call<StrArray>(kRunsM, Block{data, false}, row.min_length),
        call<StrArray>(kRunsP, static_cast<const void*>(data.data()),
                       static_cast<std::int64_t>(data.size()), row.min_length)};
    for (const StrArray& array : arrays) {
      std::vector<std::string> got;
      for (const Str& s : array.items) got.push_back(s.encoding == kUTF8 ? s.bytes : "not UTF-8");
      EXPECT_FALSE(array.null) << row.why;
      EXPECT_EQ(got, row.want) << row.why;
    }
  }
}

TEST_F(Binary, readable_runs_without_data) {
  const void* text = "abc";
  EXPECT_TRUE(call<StrArray>(kRunsS, utf8(""), k0).null);
  EXPECT_TRUE(call<StrArray>(kRunsS, none, k0).null);
  EXPECT_TRUE(call<StrArray>(kRunsM, Block{"", true}, k0).null);
  EXPECT_TRUE(call<StrArray>(kRunsM, Block{"", false}, k0).null);
  EXPECT_TRUE(call<StrArray>(kRunsP, text, -k1, k0).null);
  EXPECT_TRUE(call<StrArray>(kRunsP, text, k0, k0).null);
  const StrArray empty = call<StrArray>(kRunsP, nullptr, k5, k0);
  EXPECT_FALSE(empty.null);
  EXPECT_TRUE(empty.items.empty());
}

// A host that cannot hand out a memory block's bytes: the block reads as no
// data, and is still unlocked afterwards (the ledger checks it).
zul_host::HostConfig without_block_bytes() {
  zul_host::HostConfig config;
  config.missing = {"REALLoadObjectMethod", "memoryBlockGetPtr"};
  return config;
}
using BinaryWithoutBlockBytes = HostTestWith<without_block_bytes>;

TEST_F(BinaryWithoutBlockBytes, block_reads_as_no_data) {
  EXPECT_TRUE(call<StrArray>(kRunsM, Block{"Hello", false}, k0).null);
}

}  // namespace
