// Byte search through the stand-in host on 1 MiB and 64 MiB of text whose
// only match is the last byte, beside the C library's memchr and strcspn on
// the same bytes. Host strings are made once per size; each iteration is
// one call through the registered function pointer.
#include <benchmark/benchmark.h>

#include <cstring>
#include <map>
#include <string>

#include "host/host.h"

namespace {

using namespace text_encoding;

using zul_host::Host;

Host& host() {
  static Host* h = [] {
    auto* made = new Host();
    made->load(ZUL_PLUGIN_PATH);
    return made;
  }();
  return *h;
}

// Printable text with no control byte except a final newline.
const std::string& text(std::size_t size) {
  static std::map<std::size_t, std::string> cache;
  auto [it, fresh] = cache.try_emplace(size);
  if (fresh) {
    it->second.resize(size);
    for (std::size_t i = 0; i < size; ++i) it->second[i] = static_cast<char>('a' + i % 26);
    it->second[size - 1] = '\n';
  }
  return it->second;
}

REALstring host_text(std::size_t size) {
  static std::map<std::size_t, REALstring> cache;
  auto [it, fresh] = cache.try_emplace(size);
  if (fresh) it->second = host().make_string(text(size), text_encoding::kASCII);
  return it->second;
}

REALstring host_set(const char* set) {
  static std::map<std::string, REALstring> cache;
  auto [it, fresh] = cache.try_emplace(set);
  if (fresh) it->second = host().make_string(set, text_encoding::kASCII);
  return it->second;
}

template <class Fn>
Fn registered(const char* declaration) {
  return reinterpret_cast<Fn>(host().find(declaration));
}

void set_bytes(benchmark::State& state) {
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

void BM_InStrBytesZUL_one_byte(benchmark::State& state) {
  auto fn = registered<std::int64_t (*)(REALstring, REALstring)>(
      "InStrBytesZUL(target as string, find as string) as integer");
  REALstring target = host_text(state.range(0));
  REALstring find = host_set("\n");
  for (auto _ : state) benchmark::DoNotOptimize(fn(target, find));
  set_bytes(state);
}

void BM_memchr(benchmark::State& state) {
  const std::string& t = text(state.range(0));
  for (auto _ : state) benchmark::DoNotOptimize(std::memchr(t.data(), '\n', t.size()));
  set_bytes(state);
}

void BM_InStrBytesZUL_four_bytes(benchmark::State& state) {
  auto fn = registered<std::int64_t (*)(REALstring, REALstring)>(
      "InStrBytesZUL(target as string, find as string) as integer");
  REALstring target = host_text(state.range(0));
  REALstring find = host_set("\t\r\n\f");
  for (auto _ : state) benchmark::DoNotOptimize(fn(target, find));
  set_bytes(state);
}

void BM_strcspn(benchmark::State& state) {
  const std::string& t = text(state.range(0));
  for (auto _ : state) benchmark::DoNotOptimize(std::strcspn(t.c_str(), "\t\r\n\f"));
  set_bytes(state);
}

void BM_InStrByteRangeZUL_control(benchmark::State& state) {
  auto fn = registered<std::int64_t (*)(REALstring, std::int64_t, std::int64_t)>(
      "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer) as integer");
  REALstring target = host_text(state.range(0));
  for (auto _ : state) benchmark::DoNotOptimize(fn(target, 0, 31));
  set_bytes(state);
}

constexpr std::int64_t kMiB = 1 << 20;
BENCHMARK(BM_InStrBytesZUL_one_byte)->Arg(kMiB)->Arg(64 * kMiB);
BENCHMARK(BM_memchr)->Arg(kMiB)->Arg(64 * kMiB);
BENCHMARK(BM_InStrBytesZUL_four_bytes)->Arg(kMiB)->Arg(64 * kMiB);
BENCHMARK(BM_strcspn)->Arg(kMiB)->Arg(64 * kMiB);
BENCHMARK(BM_InStrByteRangeZUL_control)->Arg(kMiB)->Arg(64 * kMiB);

}  // namespace
