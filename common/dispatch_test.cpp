// The level list and the fall-back rule of kernels_for: a level without a
// table of its own is served by the best lower level of its architecture.
#include "common/dispatch.h"

#include <gtest/gtest.h>

#include <string>

namespace zul::simd {
namespace {

struct table {
  int id;
};

TEST(supported_isas, scalar_first_best_last) {
  const auto levels = supported_isas();
  ASSERT_FALSE(levels.empty());
  EXPECT_EQ(levels.front(), isa::scalar);
  EXPECT_EQ(levels.back(), best_isa());
  for (std::size_t i = 1; i < levels.size(); ++i) EXPECT_LT(levels[i - 1], levels[i]);
#if defined(__x86_64__)
  EXPECT_GE(levels.size(), 2u);  // SSE2 is the x86-64 baseline
#endif
}

TEST(kernels_for, falls_back_to_the_best_lower_level) {
  static const table s{0}, sse{1}, avx512{3}, neon{4}, ssse3{5};
  struct row {
    family_tables<table> tables;
    isa asked;
    int want;
    const char* why;
  } rows[] = {
      {{&s, nullptr, nullptr, nullptr, nullptr}, isa::avx512, 0, "only scalar"},
      {{&s, &sse, nullptr, nullptr, nullptr}, isa::avx2, 1, "avx2 served by sse2"},
      {{&s, &sse, nullptr, &avx512, nullptr}, isa::avx512, 3, "own avx512"},
      {{&s, &sse, nullptr, &avx512, nullptr}, isa::avx2, 1, "avx2 skips avx512"},
      {{&s, &sse, nullptr, nullptr, &neon}, isa::neon, 4, "own neon"},
      {{&s, &sse, nullptr, nullptr, nullptr}, isa::neon, 0, "neon never takes x86"},
      {{&s, &sse, nullptr, nullptr, nullptr}, isa::scalar, 0, "scalar asked"},
      {{&s, &sse, nullptr, nullptr, nullptr}, isa::ssse3, 1, "ssse3 served by sse2"},
      {{&s, &sse, nullptr, nullptr, nullptr, &ssse3}, isa::avx512, 5, "avx512 served by ssse3"},
      {{&s, &sse, nullptr, nullptr, nullptr, &ssse3}, isa::sse2, 1, "sse2 skips ssse3"},
  };
  for (const row& r : rows) {
    SCOPED_TRACE(r.why);
    EXPECT_EQ(kernels_for(r.tables, r.asked).id, r.want);
  }
}

TEST(isa_name, distinct) {
  const isa all[] = {isa::scalar, isa::sse2, isa::ssse3, isa::avx2, isa::avx512, isa::neon};
  for (isa a : all) {
    for (isa b : all) {
      if (a != b) {
        EXPECT_NE(std::string(isa_name(a)), std::string(isa_name(b)));
      }
    }
  }
}

}  // namespace
}  // namespace zul::simd
