// Repetition by doubling against the byte rule, and the mapping of
// generator values to random bytes and random 7-bit characters.
#include "binary/byte_strings.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>

namespace zul::binary {
namespace {

TEST(repeat_to_length, matches_byte_rule) {
  const std::string_view source = "0123456789abcdefghijklmnopq";
  for (std::size_t c = 0; c <= source.size(); ++c) {
    for (std::size_t length = 0; length <= 100; length += 7) {
      std::string want;
      for (std::size_t i = 0; i < length; ++i) want += c ? source[i % c] : '\0';
      const auto* pattern = reinterpret_cast<const std::uint8_t*>(source.data());
      ASSERT_EQ(repeat_to_length({pattern, c}, length), want) << c << " " << length;
    }
  }
}

// ASCII maps r to 0x20 + r mod 96 (0x7F included); raw bytes keep r's low bits.
TEST(random_bytes, maps_generator_values) {
  int next = 0;
  const std::string ascii = random_bytes(300, true, [&] { return next++; });
  const std::string raw = random_bytes(300, false, [&] { return next++ * 7; });
  for (std::size_t i = 0; i < 300; ++i) {
    EXPECT_EQ(static_cast<unsigned char>(ascii[i]), 0x20 + i % 96) << i;
    EXPECT_EQ(static_cast<unsigned char>(raw[i]), ((300 + i) * 7) & 0xFF) << i;
  }
}

}  // namespace
}  // namespace zul::binary
