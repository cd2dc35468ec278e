// Every hex kernel the machine runs against the scalar path: all 256 byte
// values and all 65,536 character pairs, then length sweeps over three
// vector widths at every misalignment, with guard bytes around the output.
#include "binary/hex_kernels.h"

#include <gtest/gtest.h>

#include <random>
#include <string>
#include <vector>

#include "tests/sweep.h"

namespace zul::binary::detail {
namespace {

using testing_sweep::for_each_kernel;

TEST(hex_kernels, every_byte_and_every_character_pair) {
  std::vector<std::uint8_t> bytes(256 * 3);
  for (std::size_t i = 0; i < bytes.size(); ++i) bytes[i] = static_cast<std::uint8_t>(i);
  std::string want(2 * bytes.size(), '?');
  encode_hex_scalar(bytes.data(), bytes.size(), want.data());
  EXPECT_EQ(want.substr(0, 8), "00010203");
  EXPECT_EQ(want.substr(2 * 0xFE, 4), "FEFF");
  std::string pairs(2 * 65536, ' ');
  for (std::size_t v = 0; v < 65536; ++v) {
    pairs[2 * v] = static_cast<char>(v >> 8);
    pairs[2 * v + 1] = static_cast<char>(v & 0xFF);
  }
  std::vector<std::uint8_t> want_bytes(65536);
  decode_hex_scalar(pairs.data(), 65536, want_bytes.data());
  for_each_kernel(hex_tables(), [&](const hex_kernels& k) {
    std::string got(want.size(), '?');
    k.encode(bytes.data(), bytes.size(), got.data());
    EXPECT_EQ(got, want);
    std::vector<std::uint8_t> got_bytes(65536);
    k.decode(pairs.data(), 65536, got_bytes.data());
    EXPECT_EQ(got_bytes, want_bytes);
  });
}

TEST(hex_kernels, length_sweep_at_every_misalignment) {
  std::mt19937 rng(9);
  const std::string alphabet = "0123456789abcdefABCDEFgG/:@`\x80\xFF";
  std::vector<std::uint8_t> in(64 + 3 * 64 * 2);
  for (auto& b : in) b = static_cast<std::uint8_t>(rng());
  std::string text(in.size(), ' ');
  for (char& c : text) c = alphabet[rng() % alphabet.size()];
  for_each_kernel(hex_tables(), [&](const hex_kernels& k) {
    for (std::size_t align = 0; align < 64; align += 3) {
      for (std::size_t n = 0; n <= 3 * 64; ++n) {
        std::string want(2 * n + 2, '#'), got(2 * n + 2, '#');
        encode_hex_scalar(in.data() + align, n, want.data() + 1);
        k.encode(in.data() + align, n, got.data() + 1);
        ASSERT_EQ(got, want) << "n " << n << " align " << align;
        std::vector<std::uint8_t> want_b(n + 2, 0xAA), got_b(n + 2, 0xAA);
        decode_hex_scalar(text.data() + align, n, want_b.data() + 1);
        k.decode(text.data() + align, n, got_b.data() + 1);
        ASSERT_EQ(got_b, want_b) << "n " << n << " align " << align;
      }
    }
  });
}

}  // namespace
}  // namespace zul::binary::detail
