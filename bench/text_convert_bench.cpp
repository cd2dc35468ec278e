// Windows-1252 encoding (reverse map and ASCII words beside the plain table
// search) and decoding (number formatting: number_format_bench.cpp). Calls
// the pure workers directly: no host in the loop.
#include <benchmark/benchmark.h>

#include <cstdio>
#include <map>
#include <random>
#include <string>
#include <vector>

#include "tests/reference/latin1_reference.h"
#include "text/latin1.h"

namespace {

namespace txt = zul::text;

// Western European prose: mostly ASCII, an accented letter or a typographic
// quote every few words, and now and then a character the set lacks.
const std::u16string& western_text(std::size_t units) {
  static std::map<std::size_t, std::u16string> cache;
  auto [it, fresh] = cache.try_emplace(units);
  if (fresh) {
    static constexpr std::u16string_view kWords =
        u"Caf\u00E9 cr\u00E8me \u201Cna\u00EFve\u201D \u20AC3 \u03A9 and more. ";
    while (it->second.size() < units) it->second += kWords;
    it->second.resize(units);
  }
  return it->second;
}

std::span<const std::uint16_t> units_of(const std::u16string& s) {
  return {reinterpret_cast<const std::uint16_t*>(s.data()), s.size()};
}

void BM_encode_cp1252(benchmark::State& state) {
  const auto units = units_of(western_text(static_cast<std::size_t>(state.range(0))));
  for (auto _ : state) benchmark::DoNotOptimize(txt::encode_single_byte(units, txt::kWindows1252));
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0) * 2);
}

void BM_encode_cp1252_table_search(benchmark::State& state) {
  const auto units = units_of(western_text(static_cast<std::size_t>(state.range(0))));
  for (auto _ : state) {
    benchmark::DoNotOptimize(
        zul::reference::encode_single_byte_reference(units, txt::escapecharsCP1252));
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0) * 2);
}

void BM_decode_cp1252(benchmark::State& state) {
  std::vector<std::uint8_t> bytes(static_cast<std::size_t>(state.range(0)));
  std::mt19937 random(3);
  for (auto& b : bytes) b = static_cast<std::uint8_t>(random());
  for (auto _ : state) benchmark::DoNotOptimize(txt::decode_single_byte(bytes, txt::kWindows1252));
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

BENCHMARK(BM_encode_cp1252)->Arg(1 << 10)->Arg(1 << 20)->Arg(64 << 20);
BENCHMARK(BM_encode_cp1252_table_search)->Arg(1 << 10)->Arg(1 << 20);
BENCHMARK(BM_decode_cp1252)->Arg(1 << 10)->Arg(1 << 20)->Arg(64 << 20);

}  // namespace
