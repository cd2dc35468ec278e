// Hex encoding: the four-bytes-a-word encoder against the plain one on every
// length and byte value, and decoding of what it wrote.
#include "binary/hex.h"

#include <gtest/gtest.h>

#include <string>

#include "tests/reference/hex_reference.h"

namespace zul::binary {
namespace {

// Every length 0..256 (all residues of the four-byte steps) over all bytes.
TEST(encode_hex, matches_reference_and_decodes_back) {
  std::string all;
  for (int b = 0; b < 256; ++b) all += static_cast<char>(b);
  const auto* data = reinterpret_cast<const std::uint8_t*>(all.data());
  for (std::size_t n = 0; n <= all.size(); ++n) {
    const std::span<const std::uint8_t> in(data + (256 - n) / 2, n);
    const std::string want = reference::encode_hex_reference(in);
    const std::string got(encode_hex(in).view());
    ASSERT_EQ(got, want) << n;
    ASSERT_EQ(decode_hex(got), std::string(reinterpret_cast<const char*>(in.data()), n)) << n;
  }
}

}  // namespace
}  // namespace zul::binary
