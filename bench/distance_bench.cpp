// Both string distances on random pairs of equal length (8, 64, 1,000 and
// 10,000 code points; arg 1 picks a-z or code points above U+00FF), each
// beside the versions they replaced, kept as the references, and beside a
// memcpy of the pair as the yardstick; then UTF-8 repair and byte-class
// checks over 1 MiB (prefix-skipping version beside the per-position
// reference). Pure workers, without the host in the way.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <map>
#include <random>
#include <string>
#include <utility>
#include <vector>

#include "search/distance.h"
#include "search/jaro_kernels.h"
#include "tests/reference/char_class_reference.h"
#include "tests/reference/distance_reference.h"
#include "tests/reference/utf8_repair_reference.h"
#include "text/char_class.h"
#include "text/utf8_repair.h"

namespace {

struct text_pair {
  std::vector<std::uint32_t> a, b;
};

// Independent random texts of len code points in pairs: a-z (kind 0), or
// 26 letters of the CJK block (kind 1), so both the byte table and the
// hashed code points are measured. Each benchmark cycles through distinct
// pairs (64 of them up to 1,000 characters, then fewer, so that they stay
// in the caches): with one pair repeated, the branch predictor learns its
// whole path through the branchy reference, which then runs 1.5 to 2.5
// times as fast as on any pair it has not seen.
const std::vector<text_pair>& random_pairs(std::size_t len, int kind) {
  static std::map<std::pair<std::size_t, int>, std::vector<text_pair>> cache;
  auto [it, fresh] = cache.try_emplace({len, kind});
  if (fresh) {
    std::mt19937 rng(static_cast<unsigned>(len) * 2 + static_cast<unsigned>(kind));
    const std::uint32_t base = kind == 0 ? 'a' : 0x4E00;
    it->second.resize(std::clamp<std::size_t>(65536 / std::max<std::size_t>(len, 1), 1, 64));
    for (auto& pair : it->second) {
      for (auto* t : {&pair.a, &pair.b}) {
        t->resize(len);
        for (auto& c : *t) c = base + rng() % 26;
      }
    }
  }
  return it->second;
}

const text_pair& random_pair(std::size_t len, int kind) { return random_pairs(len, kind)[0]; }

template <class Distance>
void run_pairs(benchmark::State& state, Distance distance) {
  const auto& pairs =
      random_pairs(static_cast<std::size_t>(state.range(0)), static_cast<int>(state.range(1)));
  std::size_t k = 0;
  for (auto _ : state) {
    const text_pair& p = pairs[k];
    benchmark::DoNotOptimize(distance(p.a, p.b));
    k = k + 1 == pairs.size() ? 0 : k + 1;
  }
  state.SetItemsProcessed(state.iterations());  // pairs
}

void pair_lengths(benchmark::internal::Benchmark* b) {
  for (const int kind : {0, 1}) {
    for (const int len : {8, 64, 1000, 10000}) b->Args({len, kind});
  }
}

void BM_memcpy_pair(benchmark::State& state) {
  const auto& p =
      random_pair(static_cast<std::size_t>(state.range(0)), static_cast<int>(state.range(1)));
  std::vector<std::uint32_t> copy(p.a.size() + p.b.size());
  for (auto _ : state) {
    std::memcpy(copy.data(), p.a.data(), p.a.size() * 4);
    std::memcpy(copy.data() + p.a.size(), p.b.data(), p.b.size() * 4);
    benchmark::DoNotOptimize(copy.data());
    benchmark::ClobberMemory();
  }
  state.SetItemsProcessed(state.iterations());
}
BENCHMARK(BM_memcpy_pair)->Apply(pair_lengths);

void BM_jaro_winkler(benchmark::State& state) {
  run_pairs(state, zul::search::jaro_winkler_distance);
}
BENCHMARK(BM_jaro_winkler)->Apply(pair_lengths);

// The one-word matcher (b of at most 64 characters) of every level the
// machine has, scalar first.
void BM_jaro_winkler_word(benchmark::State& state, zul::simd::isa level) {
  const auto& kernels = zul::simd::kernels_for(zul::search::detail::jaro_tables(), level);
  run_pairs(state, [&](const std::vector<std::uint32_t>& a, const std::vector<std::uint32_t>& b) {
    return zul::search::detail::jaro_winkler_word(a, b, kernels);
  });
}

const bool registered = [] {
  for (const zul::simd::isa level : zul::simd::supported_isas()) {
    const std::string label = std::string("BM_jaro_winkler_word/") + zul::simd::isa_name(level);
    benchmark::RegisterBenchmark(label.c_str(), BM_jaro_winkler_word, level)
        ->Args({8, 0})
        ->Args({64, 0})
        ->Args({8, 1})
        ->Args({64, 1});
  }
  return true;
}();

void BM_jaro_winkler_reference(benchmark::State& state) {
  run_pairs(state, zul::reference::jaro_winkler_distance_reference);
}
BENCHMARK(BM_jaro_winkler_reference)->Apply(pair_lengths);

void BM_edit_distance(benchmark::State& state) { run_pairs(state, zul::search::edit_distance); }
BENCHMARK(BM_edit_distance)->Apply(pair_lengths);

// What edit_distance did before the one-word path: blocks over the longer
// text for every length.
void BM_edit_distance_blocks(benchmark::State& state) {
  run_pairs(state, zul::search::detail::edit_distance_blocks);
}
BENCHMARK(BM_edit_distance_blocks)->Apply(pair_lengths);

void BM_edit_distance_reference(benchmark::State& state) {
  run_pairs(state, zul::reference::edit_distance_reference);
}
BENCHMARK(BM_edit_distance_reference)->Apply(pair_lengths);

// 1 MiB of text: arg 0 plain ASCII, arg 1 mixed Latin text with accents,
// emoji and one broken byte per KiB.
std::string make_utf8_text(int kind) {
  const std::string words[] = {"plain ", "caf\xC3\xA9 ", "na\xC3\xAFve ", "\xF0\x9F\x98\x80 ",
                               "text "};
  std::string text;
  std::size_t k = 0;
  while (text.size() < (1u << 20)) {
    if (kind == 0) {
      text += "plain text line ";
      continue;
    }
    text += words[k++ % 5];
    if (k % 200 == 0) text += '\xFF';
  }
  text.resize(1u << 20);
  return text;
}

const std::string& utf8_text(int kind) {
  static const std::array<std::string, 2> texts = {make_utf8_text(0), make_utf8_text(1)};
  return texts[static_cast<std::size_t>(kind)];
}

zul::bytes_view bytes(const std::string& s) {
  return {reinterpret_cast<const std::uint8_t*>(s.data()), s.size()};
}

void BM_repair_utf8(benchmark::State& state) {
  const std::string& in = utf8_text(static_cast<int>(state.range(0)));
  for (auto _ : state) benchmark::DoNotOptimize(zul::text::repair_utf8(bytes(in), "?"));
  state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(in.size()));
}
BENCHMARK(BM_repair_utf8)->Arg(0)->Arg(1);

void BM_repair_utf8_scalar(benchmark::State& state) {
  const std::string& in = utf8_text(static_cast<int>(state.range(0)));
  for (auto _ : state)
    benchmark::DoNotOptimize(zul::reference::repair_utf8_reference(bytes(in), "?"));
  state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(in.size()));
}
BENCHMARK(BM_repair_utf8_scalar)->Arg(0)->Arg(1);

void BM_all_bytes_in(benchmark::State& state) {
  const std::string& in = utf8_text(0);
  for (auto _ : state) {
    benchmark::DoNotOptimize(zul::text::all_bytes_in(bytes(in), zul::text::byte_class::printable));
  }
  state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(in.size()));
}
BENCHMARK(BM_all_bytes_in);

void BM_all_bytes_in_scalar(benchmark::State& state) {
  const std::string& in = utf8_text(0);
  for (auto _ : state) {
    benchmark::DoNotOptimize(
        zul::reference::all_bytes_in_reference(bytes(in), zul::text::byte_class::printable));
  }
  state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(in.size()));
}
BENCHMARK(BM_all_bytes_in_scalar);

}  // namespace
