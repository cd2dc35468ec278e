// Bitwise masks: the word-at-a-time paths against the byte rule over mask
// lengths that divide the word and those that do not, every start and
// misaligned inputs; the position stream of the second XOR.
#include "binary/bitwise.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "tests/reference/bitwise_reference.h"

namespace zul::binary {
namespace {

// A byte pattern that is not periodic in any small length.
std::vector<std::uint8_t> noise(std::size_t n, std::uint32_t seed) {
  std::vector<std::uint8_t> v(n);
  for (auto& b : v) b = static_cast<std::uint8_t>((seed = seed * 1103515245u + 12345u) >> 23);
  return v;
}

// Data lengths up to three words past the mask, three misalignments, masks of
// 1..20, 63..65 and 130 bytes, and the starts: the fast path must give the
// byte rule's result and write nothing past the data's length.
TEST(combine_fast, matches_byte_rule) {
  const auto data_pool = noise(200, 1);
  const auto mask_pool = noise(200, 2);
  std::vector<std::size_t> mask_lengths = {63, 64, 65, 130};
  for (std::size_t m = 1; m <= 20; ++m) mask_lengths.push_back(m);
  for (auto op : {detail::bit_op::kAnd, detail::bit_op::kOr, detail::bit_op::kXor}) {
    for (std::size_t m : mask_lengths) {
      for (std::size_t n = 0; n <= 3 * 8 + 9 + m; ++n) {
        for (std::size_t skew = 0; skew < 8; skew += 3) {
          const bytes_view data(data_pool.data() + skew, n);
          const bytes_view mask(mask_pool.data() + 7 - skew, m);
          for (std::size_t start = 0; start < m; start += (m > 9 ? 7 : 1)) {
            const std::string rule = reference::combine_reference(op, data, mask, start);
            std::vector<std::uint8_t> want(rule.begin(), rule.end()), got(n + 8, 0xEE);
            want.resize(n + 8, 0xEE);
            detail::combine_fast(op, data, mask, start, got.data());
            ASSERT_EQ(got, want) << "op " << static_cast<int>(op) << " m " << m << " n " << n
                                 << " start " << start << " skew " << skew;
          }
        }
      }
    }
  }
}

// Data longer than the repeated-mask pattern: segments wrap many times,
// for masks shorter and longer than the pattern and every kind of start.
TEST(combine_fast, long_data_wraps_the_mask) {
  const auto data_pool = noise(5000, 4);
  const auto mask_pool = noise(3000, 5);
  for (std::size_t m : {1u, 3u, 7u, 64u, 1000u, 1023u, 1025u, 3000u}) {
    for (std::size_t n : {1500u, 4999u}) {
      for (std::size_t start : {std::size_t{0}, m / 2, m - 1}) {
        const bytes_view data(data_pool.data(), n);
        const bytes_view mask(mask_pool.data(), m);
        const std::string rule =
            reference::combine_reference(detail::bit_op::kXor, data, mask, start);
        std::vector<std::uint8_t> got(n);
        detail::combine_fast(detail::bit_op::kXor, data, mask, start, got.data());
        ASSERT_TRUE(
            std::equal(got.begin(), got.end(), rule.begin(),
                       [](std::uint8_t g, char w) { return g == static_cast<std::uint8_t>(w); }))
            << "m " << m << " n " << n << " start " << start;
      }
    }
  }
}

TEST(xor_positions, matches_byte_rule) {
  for (std::size_t n : {0, 1, 7, 8, 9, 255, 256, 257, 600}) {
    auto got = noise(n, 3);
    auto want = got;
    for (std::size_t i = 0; i < n; ++i) want[i] ^= static_cast<std::uint8_t>(i);
    detail::xor_positions(got.data(), n);
    EXPECT_EQ(got, want) << n;
  }
}

}  // namespace
}  // namespace zul::binary
