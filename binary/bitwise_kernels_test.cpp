// Every bitwise run kernel the machine runs against the scalar run, for each
// operation, over three AVX-512 double steps at every misalignment, in place
// and into a separate buffer with guard bytes.
#include "binary/bitwise_kernels.h"

#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "tests/sweep.h"

namespace zul::binary::detail {
namespace {

TEST(bitwise_kernels, runs_match_the_scalar_run) {
  std::mt19937 rng(6);
  std::vector<std::uint8_t> a(64 + 3 * 128), b(a.size());
  for (auto& x : a) x = static_cast<std::uint8_t>(rng());
  for (auto& x : b) x = static_cast<std::uint8_t>(rng());
  testing_sweep::for_each_kernel(bitwise_tables(), [&](const bitwise_kernels& k) {
    for (int op = 0; op < 3; ++op) {
      for (std::size_t align = 0; align < 64; align += 5) {
        for (std::size_t n = 0; n <= 3 * 128; ++n) {
          std::vector<std::uint8_t> want(n + 2, 0xEE), got(n + 2, 0xEE);
          kBitwiseScalar.run[op](a.data() + align, b.data() + 63 - align, want.data() + 1, n);
          k.run[op](a.data() + align, b.data() + 63 - align, got.data() + 1, n);
          ASSERT_EQ(got, want) << "op " << op << " n " << n << " align " << align;
          std::vector<std::uint8_t> in_place(a.begin() + align, a.begin() + align + n);
          k.run[op](in_place.data(), b.data() + 63 - align, in_place.data(), n);
          ASSERT_TRUE(std::equal(in_place.begin(), in_place.end(), want.begin() + 1));
        }
      }
    }
  });
}

}  // namespace
}  // namespace zul::binary::detail
