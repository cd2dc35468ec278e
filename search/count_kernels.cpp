// Counting: the scalar path (fallback, tail and reference of the kernels)
// and the one-time choice of kernels.
#include "search/count_kernels.h"

#include <atomic>
#include <cstring>

namespace zul::search::detail {

std::uint64_t count_byte_scalar(const std::uint8_t* p, std::size_t n, std::uint8_t b) noexcept {
  std::uint64_t count = 0;
  for (std::size_t i = 0; i < n; ++i) count += p[i] == b;
  return count;
}

std::uint64_t count_pattern_from(const std::uint8_t* p, std::size_t n, const std::uint8_t* find,
                                 std::size_t m, std::size_t from, std::size_t next) noexcept {
  std::uint64_t count = 0;
  std::size_t i = from > next ? from : next;
  while (m <= n && i <= n - m) {
    const void* hit = std::memchr(p + i, find[0], n - m - i + 1);
    if (hit == nullptr) break;
    i = static_cast<std::size_t>(static_cast<const std::uint8_t*>(hit) - p);
    if (std::memcmp(p + i + 1, find + 1, m - 1) == 0) {
      ++count;
      i += m;
    } else {
      ++i;
    }
  }
  return count;
}

std::uint64_t count_pattern_scalar(const std::uint8_t* p, std::size_t n, const std::uint8_t* find,
                                   std::size_t m) noexcept {
  return count_pattern_from(p, n, find, m, 0, 0);
}

namespace {
constexpr count_kernels kScalar{count_byte_scalar, count_pattern_scalar};
#if defined(__x86_64__) || defined(_M_X64)
constexpr count_kernels kSse2{count_byte_sse2, count_pattern_sse2};
constexpr count_kernels kAvx2{count_byte_avx2, count_pattern_avx2};
constexpr count_kernels kAvx512{count_byte_avx512, count_pattern_avx512};
constexpr simd::family_tables<count_kernels> kTables{&kScalar, &kSse2, &kAvx2, &kAvx512, nullptr};
#elif defined(__aarch64__)
constexpr count_kernels kNeon{count_byte_neon, count_pattern_neon};
constexpr simd::family_tables<count_kernels> kTables{&kScalar, nullptr, nullptr, nullptr, &kNeon};
#else
constexpr simd::family_tables<count_kernels> kTables{&kScalar};
#endif
std::atomic<const count_kernels*> active_kernels{nullptr};
}  // namespace

const simd::family_tables<count_kernels>& count_tables() noexcept { return kTables; }

const count_kernels& active_count_kernels() noexcept {
  return simd::active(kTables, active_kernels);
}

}  // namespace zul::search::detail
