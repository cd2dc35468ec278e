// UTF-8 repair: the well-formedness table at each of its boundaries, cut
// sequences, every (first, second) byte pair against a decoding model, and
// the prefix-skipping repair against the per-position reference on random
// data, so the 16-byte step starts and stops at every offset.
#include "text/utf8_repair.h"

#include <gtest/gtest.h>

#include <random>
#include <string>
#include <string_view>

#include "tests/reference/utf8_repair_reference.h"

namespace zul::text {
namespace {

bytes_view b(std::string_view s) {
  return {reinterpret_cast<const std::uint8_t*>(s.data()), s.size()};
}

TEST(repair_utf8, table_boundaries) {
  struct {
    std::string_view in, want;
    const char* why;
  } rows[] = {
      {"caf\xE9", "caf?", "Latin-1 byte"},
      {std::string_view("a\0\x7F", 3), std::string_view("a\0\x7F", 3), "zero byte and 7F pass"},
      {"\xC2\x80\xDF\xBF\xC0\x80\xC1\xBF", "\xC2\x80\xDF\xBF????", "C2..DF; C0, C1 overlong"},
      {"\xE0\xA0\x80\xE0\x9F\xBF", "\xE0\xA0\x80???", "E0 needs A0..BF"},
      {"\xED\x9F\xBF\xED\xA0\x80", "\xED\x9F\xBF???", "ED stops before the surrogates"},
      {"\xEF\xBF\xBF\xE1\x80\x7F", "\xEF\xBF\xBF??\x7F", "third byte below 80"},
      {"\xF0\x90\x80\x80\xF0\x8F\xBF\xBF", "\xF0\x90\x80\x80????", "F0 needs 90..BF"},
      {"\xF4\x8F\xBF\xBF\xF4\x90\x80\x80", "\xF4\x8F\xBF\xBF????", "U+10FFFF, then above it"},
      {"\xF3\xBF\xBF\xC0\xF5\xFF\x80", "???????", "fourth byte above BF; F5..FF, lone 80"},
      {"\xE2\x82"
       "A\xE2\xE2\x82\xAC",
       "??A?\xE2\x82\xAC", "one placeholder per byte, next judged afresh"},
      {"x\xC3", "x?", "cut by the end after one byte"},
      {"x\xE2\x82", "x??", "cut after two bytes"},
      {"x\xF0\x9F\x98", "x???", "cut after three bytes"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(repair_utf8(b(row.in), "?"), row.want);
    EXPECT_EQ(zul::reference::repair_utf8_reference(b(row.in), "?"), row.want);
  }
}

// Model: decode the bits and ask whether the code point is in range, not a
// surrogate and encoded in its shortest form.
std::size_t model_length(const std::uint8_t* s, std::size_t n) {
  const std::uint8_t c = s[0];
  if (c < 0x80) return 1;
  std::size_t len = c >= 0xF0 ? 4 : c >= 0xE0 ? 3 : c >= 0xC0 ? 2 : 0;
  if (len == 0 || c >= 0xF8 || n < len) return 0;
  std::uint32_t cp = c & (0x7F >> len);
  for (std::size_t k = 1; k < len; ++k) {
    if ((s[k] & 0xC0) != 0x80) return 0;
    cp = (cp << 6) | (s[k] & 0x3F);
  }
  const std::uint32_t shortest = cp < 0x80 ? 1 : cp < 0x800 ? 2 : cp < 0x10000 ? 3 : 4;
  if (shortest != len || cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF)) return 0;
  return len;
}

TEST(well_formed_length, every_first_and_second_byte_against_model) {
  for (int first = 0; first < 256; ++first) {
    for (int second = 0; second < 256; ++second) {
      for (std::size_t n = 1; n <= 4; ++n) {
        const std::uint8_t s[4] = {static_cast<std::uint8_t>(first),
                                   static_cast<std::uint8_t>(second), 0x80, 0xBF};
        ASSERT_EQ(zul::reference::well_formed_length_reference({s, n}), model_length(s, n))
            << first << " " << second << " " << n;
      }
    }
  }
}

TEST(repair_utf8, prefix_skip_matches_reference_on_random_data) {
  std::mt19937 rng(3);
  const std::string_view pieces[] = {"a",
                                     "bcdefgh",
                                     "\xC3\xA9",
                                     "\xE2\x82\xAC",
                                     "\xF0\x9F\x98\x80",
                                     "\xED\xA0\x80",
                                     "\xC0",
                                     "\x80",
                                     "\xF4\x90",
                                     "\xE2\x82",
                                     "\xFF",
                                     std::string_view("\0", 1)};
  for (int round = 0; round < 5000; ++round) {
    std::string in;
    const std::size_t parts = rng() % 24;
    for (std::size_t k = 0; k < parts; ++k) in += pieces[rng() % (k % 3 ? 2 : std::size(pieces))];
    SCOPED_TRACE(round);
    ASSERT_EQ(repair_utf8(b(in), "<?>"), zul::reference::repair_utf8_reference(b(in), "<?>"));
    const std::size_t prefix = well_formed_prefix(b(in));
    ASSERT_TRUE(prefix == in.size() ||
                zul::reference::well_formed_length_reference(b(in).subspan(prefix)) == 0);
  }
}

}  // namespace
}  // namespace zul::text
