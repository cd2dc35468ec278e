// Every yEnc kernel the machine runs against the scalar path: all 256 byte
// values escaped and plain, runs of "=" of every length at every position
// of the first blocks (the escape carry across block ends), a final "=", and random inputs of every
// escape density over three block widths at every misalignment.
#include "encodings/yenc_kernels.h"

#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "tests/sweep.h"

namespace zul::encodings::detail {
namespace {

template <class Body>
void for_each_kernel(Body body) {
  testing_sweep::for_each_kernel(yenc_tables(), body);
  if (!simd::has_avx512_vbmi2()) GTEST_LOG_(INFO) << "no AVX-512 VBMI2: its yEnc kernel not run";
}

std::vector<std::uint8_t> scalar(const std::vector<std::uint8_t>& in, std::size_t from,
                                 std::size_t n) {
  std::vector<std::uint8_t> out(n);
  out.resize(decode_yenc_scalar(in.data() + from, n, out.data()));
  return out;
}

void expect_same(const yenc_kernels& k, const std::vector<std::uint8_t>& in, std::size_t from,
                 std::size_t n) {
  std::vector<std::uint8_t> got(n + 1, 0xEE);
  got.resize(k.decode(in.data() + from, n, got.data()));
  ASSERT_EQ(got, scalar(in, from, n)) << "n " << n << " from " << from;
}

TEST(yenc_kernels, every_byte_value_plain_and_escaped) {
  std::vector<std::uint8_t> in;
  for (int b = 0; b < 256; ++b) in.push_back(static_cast<std::uint8_t>(b));
  for (int b = 0; b < 256; ++b) {
    in.push_back('=');
    in.push_back(static_cast<std::uint8_t>(b));
  }
  for_each_kernel([&](const yenc_kernels& k) { expect_same(k, in, 0, in.size()); });
}

TEST(yenc_kernels, runs_of_equals_at_every_position) {
  for_each_kernel([&](const yenc_kernels& k) {
    for (std::size_t run = 1; run <= 5; ++run) {
      for (std::size_t at = 0; at <= 136; ++at) {
        for (std::size_t n : {at + run, at + run + 1, std::size_t{200}}) {
          std::vector<std::uint8_t> in(n, 'a');
          for (std::size_t j = at; j < at + run && j < n; ++j) in[j] = '=';
          expect_same(k, in, 0, n);
        }
      }
    }
  });
}

TEST(yenc_kernels, random_inputs_at_every_density_length_and_alignment) {
  std::mt19937 rng(4);
  std::vector<std::uint8_t> in(64 + 3 * 64 + 1);
  for_each_kernel([&](const yenc_kernels& k) {
    for (unsigned density : {0u, 2u, 30u, 70u, 100u}) {
      for (auto& b : in) b = rng() % 100 < density ? '=' : static_cast<std::uint8_t>(rng());
      for (std::size_t from = 0; from < 64; from += 7) {
        for (std::size_t n = 0; n <= 3 * 64; ++n) expect_same(k, in, from, n);
      }
    }
  });
}

}  // namespace
}  // namespace zul::encodings::detail
