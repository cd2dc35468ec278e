// The URL and HTML encoders on 1 KiB and 1 MiB of mixed text, each beside
// its plain byte-at-a-time (URL) or table-scanning (HTML) version on the
// same input. Calls the pure workers directly: no host in the loop.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <map>
#include <string>

#include "encodings/html.h"
#include "encodings/url.h"
#include "tests/reference/html_reference.h"
#include "tests/reference/url_reference.h"

namespace {

namespace enc = zul::encodings;

// Mostly letters with a space, a reserved character and a two-byte UTF-8
// letter now and then: typical of query strings and page text.
const std::string& mixed_text(std::size_t size) {
  static std::map<std::size_t, std::string> cache;
  auto [it, fresh] = cache.try_emplace(size);
  if (fresh) {
    std::string& text = it->second;
    static constexpr std::string_view kWord = "search term=caf\xC3\xA9 & more/";
    while (text.size() < size) text += kWord;
    text.resize(size);
  }
  return it->second;
}

const enc::code_points& mixed_code_points(std::size_t size) {
  static std::map<std::size_t, enc::code_points> cache;
  auto [it, fresh] = cache.try_emplace(size);
  if (fresh) {
    static constexpr std::u32string_view kWord = U"Tom & Jerry's <b>caf\u00E9</b> \u20AC ";
    while (it->second.size() < size / 4)
      it->second.insert(it->second.end(), kWord.begin(), kWord.end());
    it->second.resize(size / 4);
  }
  return it->second;
}

void BM_encode_url(benchmark::State& state) {
  const std::string& text = mixed_text(static_cast<std::size_t>(state.range(0)));
  for (auto _ : state) benchmark::DoNotOptimize(enc::encode_url(text, 1));
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

void BM_encode_url_reference(benchmark::State& state) {
  const std::string& text = mixed_text(static_cast<std::size_t>(state.range(0)));
  for (auto _ : state) benchmark::DoNotOptimize(zul::reference::encode_url_reference(text, 1));
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

template <class Out, Out (*Encode)(enc::code_point_view, std::int64_t)>
void BM_html(benchmark::State& state) {
  const enc::code_points& text = mixed_code_points(static_cast<std::size_t>(state.range(0)));
  for (auto _ : state) benchmark::DoNotOptimize(Encode(text, 0));
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

void BM_decode_url(benchmark::State& state) {
  const std::string encoded(
      enc::encode_url(mixed_text(static_cast<std::size_t>(state.range(0))), 1).view());
  for (auto _ : state) benchmark::DoNotOptimize(enc::decode_url(encoded, 1));
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * encoded.size()));
}

void BM_decode_html(benchmark::State& state) {
  const std::string encoded(
      enc::encode_html(mixed_code_points(static_cast<std::size_t>(state.range(0))), 0).view());
  const enc::code_points text(encoded.begin(), encoded.end());
  for (auto _ : state) benchmark::DoNotOptimize(enc::decode_html(text));
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * text.size() * 4));
}

void sizes(benchmark::internal::Benchmark* b) { b->Arg(1 << 10)->Arg(1 << 20); }

// The HTML encoder at the host's result limit, as a plain two-argument
// function.
zul::out_buffer encode_html_at_limit(enc::code_point_view text, std::int64_t options) {
  return enc::encode_html(text, options);
}

BENCHMARK(BM_encode_url)->Apply(sizes);
BENCHMARK(BM_encode_url_reference)->Apply(sizes);
BENCHMARK(BM_decode_url)->Apply(sizes);
BENCHMARK(BM_html<zul::out_buffer, encode_html_at_limit>)->Name("BM_encode_html")->Apply(sizes);
BENCHMARK(BM_html<std::string, zul::reference::encode_html_reference>)
    ->Name("BM_encode_html_reference")
    ->Apply(sizes);
BENCHMARK(BM_decode_html)->Apply(sizes);

}  // namespace
