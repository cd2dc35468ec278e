// Binary-string workers on 1 KiB and 1 MiB: AND with a 1-byte, 4-byte and
// 37-byte mask and XOR at an offset, each beside the byte-at-a-time rule on
// the same buffers; hex encoding beside the one-nibble-at-a-time encoder; and
// the readable-run scan over text and over a block of spaces.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <string>
#include <vector>

#include "binary/bitwise.h"
#include "binary/hex.h"
#include "binary/readable_runs.h"
#include "tests/reference/bitwise_reference.h"
#include "tests/reference/hex_reference.h"

namespace {

using zul::bytes_view;
namespace detail = zul::binary::detail;

std::vector<std::uint8_t> noise(std::size_t n) {
  std::vector<std::uint8_t> v(n);
  std::uint32_t seed = 7;
  for (auto& b : v) {
    seed = seed * 1103515245u + 12345u;
    b = static_cast<std::uint8_t>(seed >> 23);
  }
  return v;
}

void BM_and_with_mask(benchmark::State& state) {
  const auto data = noise(static_cast<std::size_t>(state.range(0)));
  const auto mask = noise(static_cast<std::size_t>(state.range(1)));
  for (auto _ : state) benchmark::DoNotOptimize(zul::binary::and_with_mask(data, mask));
  state.SetBytesProcessed(state.iterations() * state.range(0));
}

void BM_and_byte_rule(benchmark::State& state) {
  const auto data = noise(static_cast<std::size_t>(state.range(0)));
  const auto mask = noise(static_cast<std::size_t>(state.range(1)));
  for (auto _ : state) {
    benchmark::DoNotOptimize(
        zul::reference::combine_reference(detail::bit_op::kAnd, data, mask, 0));
  }
  state.SetBytesProcessed(state.iterations() * state.range(0));
}

void BM_xor_with_mask(benchmark::State& state) {
  const auto data = noise(static_cast<std::size_t>(state.range(0)));
  const auto mask = noise(static_cast<std::size_t>(state.range(1)));
  for (auto _ : state) benchmark::DoNotOptimize(zul::binary::xor_with_mask(data, mask, 3));
  state.SetBytesProcessed(state.iterations() * state.range(0));
}

void BM_xor_byte_rule(benchmark::State& state) {
  const auto data = noise(static_cast<std::size_t>(state.range(0)));
  const auto mask = noise(static_cast<std::size_t>(state.range(1)));
  for (auto _ : state) {
    benchmark::DoNotOptimize(
        zul::reference::combine_reference(detail::bit_op::kXor, data, mask, 3 % mask.size()));
  }
  state.SetBytesProcessed(state.iterations() * state.range(0));
}

void BM_encode_hex(benchmark::State& state) {
  const auto data = noise(static_cast<std::size_t>(state.range(0)));
  for (auto _ : state) benchmark::DoNotOptimize(zul::binary::encode_hex(data));
  state.SetBytesProcessed(state.iterations() * state.range(0));
}

void BM_encode_hex_reference(benchmark::State& state) {
  const auto data = noise(static_cast<std::size_t>(state.range(0)));
  for (auto _ : state) benchmark::DoNotOptimize(zul::reference::encode_hex_reference(data));
  state.SetBytesProcessed(state.iterations() * state.range(0));
}

// range(1): 0 for words of text split by NUL bytes, 1 for spaces only.
void BM_readable_runs(benchmark::State& state) {
  std::vector<std::uint8_t> data(static_cast<std::size_t>(state.range(0)), ' ');
  if (state.range(1) == 0) {
    for (std::size_t i = 0; i < data.size(); ++i) data[i] = i % 12 == 11 ? 0 : 'a' + i % 26;
  }
  for (auto _ : state) {
    std::size_t kept = 0;
    zul::binary::for_each_readable_run(data, 0, [&](bytes_view run) { kept += run.size(); });
    benchmark::DoNotOptimize(kept);
  }
  state.SetBytesProcessed(state.iterations() * state.range(0));
}

void bitwise_sizes(benchmark::internal::Benchmark* b) {
  for (std::int64_t n : {1 << 10, 1 << 20}) {
    for (std::int64_t m : {1, 4, 37}) b->Args({n, m});
  }
}

BENCHMARK(BM_and_with_mask)->Apply(bitwise_sizes);
BENCHMARK(BM_and_byte_rule)->Apply(bitwise_sizes);
BENCHMARK(BM_xor_with_mask)->Apply(bitwise_sizes);
BENCHMARK(BM_xor_byte_rule)->Apply(bitwise_sizes);
BENCHMARK(BM_encode_hex)->Arg(1 << 10)->Arg(1 << 20);
BENCHMARK(BM_encode_hex_reference)->Arg(1 << 10)->Arg(1 << 20);
BENCHMARK(BM_readable_runs)->Args({1 << 20, 0})->Args({1 << 20, 1});

}  // namespace
