// The scalar UTF-8 scan (the fallback, the tail, and the exact rules around
// a faulty byte) and the choice of block kernel for the machine.
#include "common/utf8_valid.h"

#include <cstring>

namespace zul {

std::size_t utf8_scan(const std::uint8_t* p, std::size_t i, std::size_t n,
                      std::size_t limit) noexcept {
  constexpr std::uint64_t kHighBits = 0x8080808080808080ull;
  while (i < limit) {
    while (i + 16 <= n) {  // sixteen ASCII bytes at a time
      std::uint64_t w0, w1;
      std::memcpy(&w0, p + i, 8);
      std::memcpy(&w1, p + i + 8, 8);
      if ((w0 | w1) & kHighBits) break;
      i += 16;
    }
    if (i >= limit) break;
    const std::uint8_t c = p[i];
    if (c < 0x80) {
      ++i;
      continue;
    }
    const utf8_lead row = kUtf8Leads[c];
    if (row.length == 0 || n - i < row.length) return i;
    if (p[i + 1] < row.second_low || p[i + 1] > row.second_high) return i;
    if (row.length >= 3 && !is_utf8_continuation(p[i + 2])) return i;
    if (row.length == 4 && !is_utf8_continuation(p[i + 3])) return i;
    i += row.length;
  }
  return i;
}

}  // namespace zul

namespace zul::simd {
namespace {

std::size_t copy_valid_scalar(const std::uint8_t* in, std::size_t n, std::uint8_t* out) noexcept {
  const std::size_t end = utf8_scan(in, 0, n, n);
  if (out != nullptr && end != 0) std::memcpy(out, in, end);
  return end;
}

constexpr utf8_kernels kScalar{copy_valid_scalar, nullptr, 1};

}  // namespace

namespace detail {

std::size_t utf8_boundary_before(const std::uint8_t* in, std::size_t end) noexcept {
  for (std::size_t back = 1; back <= 3 && back <= end; ++back) {
    const std::uint8_t c = in[end - back];
    if (c < 0x80) break;
    if (c >= 0xC0) {
      const std::size_t length = c >= 0xF0 ? 4 : c >= 0xE0 ? 3 : 2;
      return length > back ? end - back : end;
    }
  }
  return end;
}

}  // namespace detail

const family_tables<utf8_kernels>& utf8_tables() noexcept {
#if defined(__x86_64__)
  static constexpr family_tables<utf8_kernels> tables{&kScalar, &detail::kUtf8Sse2,
                                                      &detail::kUtf8Avx2, &detail::kUtf8Avx512};
#elif defined(__aarch64__)
  static constexpr family_tables<utf8_kernels> tables{&kScalar, nullptr, nullptr, nullptr,
                                                      &detail::kUtf8Neon};
#else
  static constexpr family_tables<utf8_kernels> tables{&kScalar};
#endif
  return tables;
}

const utf8_kernels& utf8_active() noexcept {
  static std::atomic<const utf8_kernels*> cache{nullptr};
  return active(utf8_tables(), cache);
}

}  // namespace zul::simd
