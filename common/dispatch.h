// One table of kernel function pointers per family, chosen once per process
// for the best instruction set the machine supports. A family declares its
// table struct and one table per level it implements; `kernels_for` picks
// the best implemented level not above the one asked for, and `active`
// caches the pick for the machine in an atomic pointer (no lock and no
// CPUID on the call path). Tests and benchmarks call `kernels_for` with
// every level of supported_isas() to run each kernel on the same cases.
#pragma once

#include <atomic>

#include "common/cpu.h"

namespace zul::simd {

// The tables one family implements; null where a level has no kernels of
// its own (the next lower level's table serves it). SSSE3 comes last so the
// few families with an SSSE3 table name it and the others need not.
template <class Table>
struct family_tables {
  const Table* scalar = nullptr;
  const Table* sse2 = nullptr;
  const Table* avx2 = nullptr;
  const Table* avx512 = nullptr;
  const Table* neon = nullptr;
  const Table* ssse3 = nullptr;
};

// The table for `level`, or the best lower level the family implements.
// `scalar` must be set.
template <class Table>
const Table& kernels_for(const family_tables<Table>& t, isa level) noexcept {
  switch (level) {
    case isa::avx512:
      if (t.avx512) return *t.avx512;
      [[fallthrough]];
    case isa::avx2:
      if (t.avx2) return *t.avx2;
      [[fallthrough]];
    case isa::ssse3:
      if (t.ssse3) return *t.ssse3;
      [[fallthrough]];
    case isa::sse2:
      if (t.sse2) return *t.sse2;
      break;
    case isa::neon:
      if (t.neon) return *t.neon;
      break;
    case isa::scalar:
      break;
  }
  return *t.scalar;
}

// The machine's table for one family, chosen at first use. Racing first
// calls store the same pointer, so a relaxed pointer suffices: the tables
// themselves are constants.
template <class Table>
const Table& active(const family_tables<Table>& t, std::atomic<const Table*>& cache) noexcept {
  const Table* p = cache.load(std::memory_order_relaxed);
  if (p == nullptr) {
    p = &kernels_for(t, best_isa());
    cache.store(p, std::memory_order_relaxed);
  }
  return *p;
}

}  // namespace zul::simd
