// The vector kernels at every level this machine runs, and the scalar
// path, on 1 KiB, 1 MiB and 64 MiB, beside memcpy of the same size timed in
// the same run: figures are read as a share of memcpy's bytes per second.
// Inputs hold no match until the last byte, so each search scans it all.
// Beside the kernels, the dispatched workers the adapters call ("/worker"),
// result buffer included, on the same inputs.
#include <benchmark/benchmark.h>

#include <cstring>
#include <map>
#include <random>
#include <string>
#include <vector>

#include "binary/bitwise.h"
#include "binary/bitwise_kernels.h"
#include "binary/hex.h"
#include "binary/hex_kernels.h"
#include "common/byte_set.h"
#include "encodings/yenc.h"
#include "encodings/yenc_kernels.h"
#include "search/count_kernels.h"
#include "text/char_class.h"
#include "text/char_class_kernels.h"

namespace {

using namespace zul::simd;

const std::vector<std::uint8_t>& text(std::size_t size) {
  static std::map<std::size_t, std::vector<std::uint8_t>> cache;
  auto [it, fresh] = cache.try_emplace(size);
  if (fresh) {
    it->second.resize(size);
    for (std::size_t i = 0; i < size; ++i) it->second[i] = static_cast<std::uint8_t>('a' + i % 26);
    it->second[size - 1] = '\n';
  }
  return it->second;
}

void set_bytes(benchmark::State& state) {
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

void BM_memcpy(benchmark::State& state) {
  const auto& in = text(state.range(0));
  std::vector<std::uint8_t> out(in.size());
  for (auto _ : state) {
    std::memcpy(out.data(), in.data(), in.size());
    benchmark::DoNotOptimize(out.data());
    benchmark::ClobberMemory();
  }
  set_bytes(state);
}

void find_first_in_set_bench(benchmark::State& state, isa level, const char* members) {
  const auto& k = kernels_for(detail::byte_set_tables(), level);
  const byte_set set = make_byte_set(zul::bytes_of(members));
  const auto& in = text(state.range(0));
  for (auto _ : state) benchmark::DoNotOptimize(k.find_first(set, in.data(), in.size()));
  set_bytes(state);
}

void count_byte_bench(benchmark::State& state, isa level) {
  const auto& k = kernels_for(zul::search::detail::count_tables(), level);
  const auto& in = text(state.range(0));
  for (auto _ : state) benchmark::DoNotOptimize(k.count_byte(in.data(), in.size(), 'e'));
  set_bytes(state);
}

// The pattern's first byte occurs every 26 bytes, its last byte never.
void count_pattern_bench(benchmark::State& state, isa level, std::string_view find) {
  const auto& k = kernels_for(zul::search::detail::count_tables(), level);
  const auto& in = text(state.range(0));
  const auto* f = reinterpret_cast<const std::uint8_t*>(find.data());
  for (auto _ : state)
    benchmark::DoNotOptimize(k.count_pattern(in.data(), in.size(), f, find.size()));
  set_bytes(state);
}

// Figures count input bytes: encode reads n bytes, decode 2n characters.
void encode_hex_bench(benchmark::State& state, isa level) {
  const auto& k = kernels_for(zul::binary::detail::hex_tables(), level);
  const auto& in = text(state.range(0));
  std::vector<char> out(2 * in.size());
  for (auto _ : state) {
    k.encode(in.data(), in.size(), out.data());
    benchmark::ClobberMemory();
  }
  set_bytes(state);
}

void decode_hex_bench(benchmark::State& state, isa level) {
  const auto& k = kernels_for(zul::binary::detail::hex_tables(), level);
  const auto& in = text(state.range(0));
  std::vector<std::uint8_t> out(in.size() / 2);
  for (auto _ : state) {
    k.decode(reinterpret_cast<const char*>(in.data()), out.size(), out.data());
    benchmark::ClobberMemory();
  }
  set_bytes(state);
}

// yEnc-like data: random bytes, with NUL, LF, CR and "=" escaped (about
// 1.6% of the input are escapes, as in real yEnc parts).
const std::vector<std::uint8_t>& yenc_data(std::size_t size) {
  static std::map<std::size_t, std::vector<std::uint8_t>> cache;
  auto [it, fresh] = cache.try_emplace(size);
  if (fresh) {
    std::mt19937 rng(1);
    auto& d = it->second;
    while (d.size() < size) {
      const auto b = static_cast<std::uint8_t>(rng());
      if (b == 0 || b == '\n' || b == '\r' || b == '=') d.push_back('=');
      d.push_back(b);
    }
    d.resize(size);
  }
  return it->second;
}

void decode_yenc_bench(benchmark::State& state, isa level) {
  const auto& k = kernels_for(zul::encodings::detail::yenc_tables(), level);
  const auto& in = yenc_data(state.range(0));
  std::vector<std::uint8_t> out(in.size());
  for (auto _ : state) benchmark::DoNotOptimize(k.decode(in.data(), in.size(), out.data()));
  set_bytes(state);
}

// XOR of two buffers of the same size into a third (the mask walk's run).
void xor_run_bench(benchmark::State& state, isa level) {
  const auto& k = kernels_for(zul::binary::detail::bitwise_tables(), level);
  const auto& in = text(state.range(0));
  const std::vector<std::uint8_t> mask(in.rbegin(), in.rend());
  std::vector<std::uint8_t> out(in.size());
  for (auto _ : state) {
    k.run[2](in.data(), mask.data(), out.data(), in.size());
    benchmark::ClobberMemory();
  }
  set_bytes(state);
}

void replace_non_printable_bench(benchmark::State& state, isa level) {
  const auto& k = kernels_for(zul::text::detail::char_class_tables(), level);
  const auto& in = text(state.range(0));
  std::vector<std::uint8_t> out(in.size());
  for (auto _ : state) {
    k.replace_non_printable(in.data(), in.size(), '.', out.data());
    benchmark::ClobberMemory();
  }
  set_bytes(state);
}

std::string_view chars(const std::vector<std::uint8_t>& v) {
  return {reinterpret_cast<const char*>(v.data()), v.size()};
}

void encode_hex_worker(benchmark::State& state) {
  const auto& in = text(state.range(0));
  for (auto _ : state) benchmark::DoNotOptimize(zul::binary::encode_hex(in));
  set_bytes(state);
}

void decode_hex_worker(benchmark::State& state) {
  const auto& in = text(state.range(0));
  for (auto _ : state) benchmark::DoNotOptimize(zul::binary::decode_hex(chars(in)));
  set_bytes(state);
}

void decode_yenc_worker(benchmark::State& state) {
  const auto& in = yenc_data(state.range(0));
  for (auto _ : state) benchmark::DoNotOptimize(zul::encodings::decode_yenc(chars(in)));
  set_bytes(state);
}

// XOR with a mask as long as the data (one kernel run, as xor_run).
void xor_worker(benchmark::State& state) {
  const auto& in = text(state.range(0));
  const std::vector<std::uint8_t> mask(in.rbegin(), in.rend());
  for (auto _ : state) benchmark::DoNotOptimize(zul::binary::xor_with_mask(in, mask, 0));
  set_bytes(state);
}

void replace_non_printable_worker(benchmark::State& state) {
  const auto& in = text(state.range(0));
  for (auto _ : state) benchmark::DoNotOptimize(zul::text::replace_non_printable(in, '.'));
  set_bytes(state);
}

void sizes(benchmark::internal::Benchmark* b) { b->Arg(1 << 10)->Arg(1 << 20)->Arg(64 << 20); }

const bool registered = [] {
  sizes(benchmark::RegisterBenchmark("memcpy", BM_memcpy));
  sizes(benchmark::RegisterBenchmark("encode_hex/worker", encode_hex_worker));
  sizes(benchmark::RegisterBenchmark("decode_hex/worker", decode_hex_worker));
  sizes(benchmark::RegisterBenchmark("decode_yenc/worker", decode_yenc_worker));
  sizes(benchmark::RegisterBenchmark("xor_run/worker", xor_worker));
  sizes(benchmark::RegisterBenchmark("replace_non_printable/worker", replace_non_printable_worker));
  for (isa level : supported_isas()) {
    const std::string name = isa_name(level);
    sizes(benchmark::RegisterBenchmark(("find_first_in_set_4/" + name).c_str(),
                                       find_first_in_set_bench, level, "\t\r\n\f"));
    sizes(benchmark::RegisterBenchmark(("find_first_in_set_16/" + name).c_str(),
                                       find_first_in_set_bench, level, "\t\r\n\f<>&\"'%=;:!?#"));
    sizes(benchmark::RegisterBenchmark(("count_byte/" + name).c_str(), count_byte_bench, level));
    sizes(benchmark::RegisterBenchmark(("count_pattern_4/" + name).c_str(), count_pattern_bench,
                                       level, "efg!"));
    sizes(benchmark::RegisterBenchmark(("count_pattern_16/" + name).c_str(), count_pattern_bench,
                                       level, "efghijklmnopqrs!"));
    sizes(benchmark::RegisterBenchmark(("encode_hex/" + name).c_str(), encode_hex_bench, level));
    sizes(benchmark::RegisterBenchmark(("decode_hex/" + name).c_str(), decode_hex_bench, level));
    sizes(benchmark::RegisterBenchmark(("decode_yenc/" + name).c_str(), decode_yenc_bench, level));
    sizes(benchmark::RegisterBenchmark(("xor_run/" + name).c_str(), xor_run_bench, level));
    sizes(benchmark::RegisterBenchmark(("replace_non_printable/" + name).c_str(),
                                       replace_non_printable_bench, level));
  }
  return true;
}();

}  // namespace
