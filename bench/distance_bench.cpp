// Edit distance of two texts of 1,000 code points (bit-vector version beside
// the row-by-row reference), Jaro-Winkler on the same pair, and UTF-8 repair
// and byte-class checks over 1 MiB (prefix-skipping version beside the
// per-position reference), on pure workers without the host in the way.
#include <benchmark/benchmark.h>

#include <array>
#include <random>
#include <string>
#include <vector>

#include "search/distance.h"
#include "tests/reference/char_class_reference.h"
#include "tests/reference/utf8_repair_reference.h"
#include "text/char_class.h"
#include "text/utf8_repair.h"

namespace {

// Two related texts: b is a with about one character in ten changed.
struct text_pair {
  std::vector<std::uint32_t> a, b;
};

const text_pair& pair_1k() {
  static const text_pair p = [] {
    std::mt19937 rng(1);
    text_pair made;
    made.a.resize(1000);
    for (auto& c : made.a) c = 'a' + rng() % 26;
    made.b = made.a;
    for (auto& c : made.b) {
      if (rng() % 10 == 0) c = rng() % 2 ? 0x1F600 : 'a' + rng() % 26;
    }
    return made;
  }();
  return p;
}

void BM_edit_distance_bits(benchmark::State& state) {
  const auto& p = pair_1k();
  for (auto _ : state) benchmark::DoNotOptimize(zul::search::edit_distance(p.a, p.b));
  state.SetItemsProcessed(state.iterations() * 1000 * 1000);  // matrix cells
}
BENCHMARK(BM_edit_distance_bits);

void BM_edit_distance_rows(benchmark::State& state) {
  const auto& p = pair_1k();
  for (auto _ : state) benchmark::DoNotOptimize(zul::search::detail::edit_distance_rows(p.a, p.b));
  state.SetItemsProcessed(state.iterations() * 1000 * 1000);
}
BENCHMARK(BM_edit_distance_rows);

void BM_jaro_winkler(benchmark::State& state) {
  const auto& p = pair_1k();
  for (auto _ : state) benchmark::DoNotOptimize(zul::search::jaro_winkler_distance(p.a, p.b));
}
BENCHMARK(BM_jaro_winkler);

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
