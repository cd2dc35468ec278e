// Percent-encoding: the option matrix, every byte value, the malformed
// escapes near the end, and the table-driven versions against the plain
// ones on long random input.
#include "encodings/url.h"

#include <gtest/gtest.h>

#include <random>
#include <string>

#include "common/cpu.h"
#include "tests/reference/url_reference.h"
#include "tests/sweep.h"

namespace zul::encodings {
namespace {

using namespace std::string_view_literals;

TEST(encode_url, option_matrix) {
  struct {
    std::string_view in;
    std::int64_t options;
    std::string_view want;
    const char* why;
  } rows[] = {
      {"a b+c", 0, "a%20b+c", "default"},
      {"a b+c", 1, "a+b%2Bc", "form encoding"},
      {"a b+c", 2, "a%20b%2Bc", "both escaped"},
      {"a b+c", 3, "a%20b+c", "3 encodes as 0"},
      {"a b+c", 5, "a+b%2Bc", "high bits ignored"},
      {"a b+c", -4, "a%20b+c", "negative: low bits 0"},
      {"A-z_0.9!*@", 0, "A-z_0.9!*@", "unreserved set"},
      {"~/'()", 0, "%7E%2F%27%28%29", "reserved punctuation"},
      {"\xC3\xA9", 0, "%C3%A9", "high bytes"},
      {"\0\x7F"sv, 0, "%00%7F", "zero and DEL"},
      {"", 1, "", "empty"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(encode_url(row.in, row.options), row.want);
    EXPECT_EQ(zul::reference::encode_url_reference(row.in, row.options), row.want);
  }
}

TEST(decode_url, malformed_and_truncated_escapes) {
  struct {
    std::string_view in;
    std::int64_t options;
    std::string_view want;
    const char* why;
  } rows[] = {
      {"%41%4a%4A", 0, "AJJ", "either case"},
      {"%G1", 0, "\x01", "non-digit counts as 0"},
      {"%zz", 0, "\0"sv, "two non-digits"},
      {"%%41", 0,
       "\x04"
       "1",
       "second % is a digit 0"},
      {"%4", 0, "@", "one digit at the end"},
      {"100%", 0, "100\0"sv, "% as the last byte"},
      {"a+b", 0, "a+b", "plus kept, options 0"},
      {"a+b", 2, "a+b", "plus kept, options 2"},
      {"a+b", 1, "a b", "plus is space, options 1"},
      {"a+b", 3, "a b", "plus is space, options 3"},
      {"%C3%A9", 0, "\xC3\xA9", "high bytes"},
      {"", 0, "", "empty"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(decode_url(row.in, row.options), row.want);
    EXPECT_EQ(zul::reference::decode_url_reference(row.in, row.options), row.want);
  }
}

TEST(encode_url, long_random_input_matches_reference_and_round_trips) {
  std::mt19937 rng(7);
  for (std::size_t size : {1u, 63u, 64u, 65u, 4096u, 100000u}) {
    std::string in(size, '\0');
    for (char& c : in) c = static_cast<char>(rng() % 3 ? 'a' + rng() % 26 : rng() % 256);
    for (std::int64_t options = 0; options < 4; ++options) {
      SCOPED_TRACE(testing::Message() << size << " bytes, options " << options);
      const std::string encoded(encode_url(in, options).view());
      EXPECT_EQ(encoded, zul::reference::encode_url_reference(in, options));
      EXPECT_EQ(decode_url(encoded, options),
                zul::reference::decode_url_reference(encoded, options));
      EXPECT_EQ(decode_url(in, options), zul::reference::decode_url_reference(in, options));
      if (options != 3) {
        EXPECT_EQ(decode_url(encoded, options), in);
      }
    }
  }
}

// Every byte-set search level against the reference, with each byte that
// needs work at every position of every length up to three 64-byte blocks.
TEST(encode_url, every_scan_level_with_a_special_byte_everywhere) {
  std::string specials = " +%/\x00\x7F\x80\xFF";
  specials[4] = '\0';
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    testing_sweep::special_byte_sweep(specials, 2 * 64 + 3, [&](const std::string& in) {
      for (std::int64_t options = 0; options < 4; ++options) {
        ASSERT_EQ(encode_url(in, options, kMaxResultBytes, scan_for(level)),
                  reference::encode_url_reference(in, options))
            << options;
        ASSERT_EQ(decode_url(in, options, scan_for(level)),
                  reference::decode_url_reference(in, options))
            << options;
      }
    });
    const std::string all = testing_sweep::every_byte_value();
    const std::string encoded(encode_url(all, 1, kMaxResultBytes, scan_for(level)).view());
    EXPECT_EQ(encoded, reference::encode_url_reference(all, 1));
    EXPECT_EQ(decode_url(encoded, 1, scan_for(level)), all);
  }
}

}  // namespace
}  // namespace zul::encodings
