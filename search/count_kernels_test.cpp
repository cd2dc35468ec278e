// Every counting kernel the machine runs against a plain model, on length
// sweeps with every misalignment, all 256 byte values, inputs long enough to
// fill the 8-bit lane counters, and dense near-matches for the
// non-overlapping rule.
#include "search/count_kernels.h"

#include <gtest/gtest.h>

#include <random>
#include <string_view>
#include <vector>

#include "tests/sweep.h"

namespace zul::search::detail {
namespace {

using testing_sweep::for_each_kernel;

std::uint64_t model(const std::uint8_t* p, std::size_t n, std::string_view find) {
  const std::size_t m = find.size();
  std::uint64_t count = 0;
  for (std::size_t i = 0; m <= n && i <= n - m;) {
    if (std::string_view(reinterpret_cast<const char*>(p + i), m) == find) {
      ++count;
      i += m;
    } else {
      ++i;
    }
  }
  return count;
}

TEST(count_byte, every_value_length_and_alignment) {
  std::mt19937 rng(3);
  std::vector<std::uint8_t> buf(2 * 64 + 3 * 256);
  for (auto& b : buf) b = static_cast<std::uint8_t>(rng() % 4 * 85);  // 0, 85, 170, 255
  // Offsets from a 64-byte boundary: the kernels align their rounds to one.
  const std::uint8_t* line = buf.data() + (-reinterpret_cast<std::uintptr_t>(buf.data()) & 63);
  for_each_kernel(count_tables(), [&](const count_kernels& k) {
    for (int v = 0; v < 256; ++v) {
      const auto b = static_cast<std::uint8_t>(v);
      for (std::size_t align : {0u, 1u, 31u, 32u, 33u, 63u}) {
        for (std::size_t n = 0; n <= 3 * 256; n += (v % 85 == 0 ? 1 : 97)) {
          ASSERT_EQ(k.count_byte(line + align, n, b), count_byte_scalar(line + align, n, b))
              << v << " n " << n << " align " << align;
        }
      }
    }
  });
}

TEST(count_byte, lane_counters_do_not_wrap) {
  // Every byte matches: each 8-bit lane counts up to its flush limit.
  const std::vector<std::uint8_t> same(255 * 128 * 3 + 77, 'x');
  for_each_kernel(count_tables(), [&](const count_kernels& k) {
    EXPECT_EQ(k.count_byte(same.data(), same.size(), 'x'), same.size());
    EXPECT_EQ(k.count_byte(same.data(), same.size(), 'y'), 0u);
  });
}

// Tiny alphabets make matches, near-matches and overlaps frequent; lengths
// cross block ends so matches straddle the vector part and the scalar tail.
TEST(count_pattern, random_strings_agree_with_the_model) {
  std::mt19937 rng(11);
  for (int round = 0; round < 3000; ++round) {
    const std::size_t n = rng() % 400;
    const std::size_t m = 2 + rng() % (round % 3 == 0 ? 3 : 40);
    const int alphabet = 1 + static_cast<int>(rng() % 3);
    std::vector<std::uint8_t> s(n + 1);
    std::string find(m, 'a');
    for (auto& c : s) c = static_cast<std::uint8_t>('a' + rng() % alphabet);
    for (auto& c : find) c = static_cast<char>('a' + rng() % alphabet);
    const std::size_t align = rng() % 2;
    const std::uint64_t want = model(s.data() + align, n, find);
    for_each_kernel(count_tables(), [&](const count_kernels& k) {
      ASSERT_EQ(k.count_pattern(s.data() + align, n,
                                reinterpret_cast<const std::uint8_t*>(find.data()), m),
                want)
          << "n " << n << " m " << m;
    });
  }
}

}  // namespace
}  // namespace zul::search::detail
