// StrZUL's and ScientificStrZUL's formatting of random doubles across
// exponents, beside the exact digit generator they replaced (kept as the
// reference), std::to_chars asked for the same digits, and the C library's
// snprintf. Arg 0: decimal magnitudes 1e-20 to 1e20; arg 1: random bit
// patterns over the whole range of finite doubles.
#include <benchmark/benchmark.h>

#include <bit>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <random>
#include <vector>

#include "tests/reference/number_format_reference.h"
#include "text/number_format.h"

namespace {

namespace txt = zul::text;

const std::vector<double>& sample_doubles(std::int64_t kind) {
  static const std::vector<double> values[2] = {
      [] {
        std::vector<double> v;
        std::mt19937_64 random(5);
        std::uniform_real_distribution<double> mantissa(1.0, 10.0);
        for (int i = 0; i < 1024; ++i) {
          v.push_back(mantissa(random) * std::pow(10.0, static_cast<int>(random() % 41) - 20));
        }
        return v;
      }(),
      [] {
        std::vector<double> v;
        std::mt19937_64 random(6);
        while (v.size() < 1024) {
          const double d = std::bit_cast<double>(random());
          if (std::isfinite(d)) v.push_back(d);
        }
        return v;
      }(),
  };
  return values[kind];
}

template <class Format>
void run_values(benchmark::State& state, Format format) {
  const std::vector<double>& values = sample_doubles(state.range(0));
  std::size_t i = 0;
  for (auto _ : state) benchmark::DoNotOptimize(format(values[i++ & 1023]));
  state.SetItemsProcessed(state.iterations());
}

void BM_format_plain(benchmark::State& state) { run_values(state, txt::format_plain); }
void BM_format_plain_reference(benchmark::State& state) {
  run_values(state, zul::reference::format_plain_reference);
}

void BM_format_scientific(benchmark::State& state) {
  run_values(state, [](double d) { return txt::format_scientific(d, 6); });
}
void BM_format_scientific_reference(benchmark::State& state) {
  run_values(state, [](double d) { return zul::reference::format_scientific_reference(d, 6); });
}

// The exact digits of the same values: six decimals in exponent notation
// (ScientificStrZUL's work), and sixteen significant digits (as many as
// StrZUL shows, plus the one that decides its rounding).
void BM_to_chars_scientific(benchmark::State& state) {
  run_values(state, [](double d) {
    char buffer[40];
    return std::to_chars(buffer, buffer + sizeof buffer, d, std::chars_format::scientific, 6).ptr -
           buffer;
  });
}
void BM_to_chars_16_digits(benchmark::State& state) {
  run_values(state, [](double d) {
    char buffer[40];
    return std::to_chars(buffer, buffer + sizeof buffer, d, std::chars_format::scientific, 15).ptr -
           buffer;
  });
}

void BM_snprintf_fixed_99(benchmark::State& state) {
  run_values(state, [](double d) {
    char buffer[500];
    return std::snprintf(buffer, sizeof buffer, "%.99f", d);
  });
}
void BM_snprintf_scientific(benchmark::State& state) {
  run_values(state, [](double d) {
    char buffer[500];
    return std::snprintf(buffer, 499, "%.6e", d);
  });
}

BENCHMARK(BM_format_plain)->Arg(0)->Arg(1);
BENCHMARK(BM_format_plain_reference)->Arg(0)->Arg(1);
BENCHMARK(BM_to_chars_16_digits)->Arg(0)->Arg(1);
BENCHMARK(BM_snprintf_fixed_99)->Arg(0)->Arg(1);
BENCHMARK(BM_format_scientific)->Arg(0)->Arg(1);
BENCHMARK(BM_format_scientific_reference)->Arg(0)->Arg(1);
BENCHMARK(BM_to_chars_scientific)->Arg(0)->Arg(1);
BENCHMARK(BM_snprintf_scientific)->Arg(0)->Arg(1);

}  // namespace
