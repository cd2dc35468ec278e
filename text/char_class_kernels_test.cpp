// Every printable-filter kernel the machine runs against the scalar path:
// all 256 byte values at every lane, and lengths over three vector widths at
// every misalignment, with guard bytes around the output.
#include "text/char_class_kernels.h"

#include <gtest/gtest.h>

#include <vector>

#include "tests/sweep.h"

namespace zul::text::detail {
namespace {

TEST(replace_non_printable_kernels, match_the_scalar_path) {
  std::vector<std::uint8_t> in(64 + 3 * 64 + 256);
  for (std::size_t i = 0; i < in.size(); ++i) in[i] = static_cast<std::uint8_t>(i * 37 + 11);
  testing_sweep::for_each_kernel(char_class_tables(), [&](const char_class_kernels& k) {
    for (std::size_t align = 0; align < 64; ++align) {
      for (std::size_t n : {std::size_t{0}, std::size_t{1}, std::size_t{31}, std::size_t{32},
                            std::size_t{33}, std::size_t{63}, std::size_t{64}, std::size_t{65},
                            std::size_t{127}, std::size_t{192}, std::size_t{256}}) {
        for (std::uint8_t with : {std::uint8_t{'.'}, std::uint8_t{0}, std::uint8_t{0xFF}}) {
          std::vector<std::uint8_t> want(n + 2, 0xEE), got(n + 2, 0xEE);
          replace_non_printable_scalar(in.data() + align, n, with, want.data() + 1);
          k.replace_non_printable(in.data() + align, n, with, got.data() + 1);
          ASSERT_EQ(got, want) << "n " << n << " align " << align;
        }
      }
    }
  });
}

}  // namespace
}  // namespace zul::text::detail
