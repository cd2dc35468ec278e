// The printable filter's scalar path (fallback and tail) and the one-time
// choice of kernels.
#include "text/char_class_kernels.h"

#include <atomic>

namespace zul::text::detail {

void replace_non_printable_scalar(const std::uint8_t* in, std::size_t n, std::uint8_t replacement,
                                  std::uint8_t* out) noexcept {
  // Branch-free per byte: c - 0x20 wraps below 0x60 exactly for 20..7F.
  for (std::size_t i = 0; i < n; ++i) {
    const std::uint8_t c = in[i];
    out[i] = static_cast<std::uint8_t>(c - 0x20) < 0x60 ? c : replacement;
  }
}

namespace {
constexpr char_class_kernels kScalar{replace_non_printable_scalar};
#if defined(__x86_64__) || defined(_M_X64)
constexpr char_class_kernels kAvx2{replace_non_printable_avx2};
constexpr char_class_kernels kAvx512{replace_non_printable_avx512};
constexpr simd::family_tables<char_class_kernels> kTables{&kScalar, nullptr, &kAvx2, &kAvx512,
                                                          nullptr};
#elif defined(__aarch64__)
constexpr char_class_kernels kNeon{replace_non_printable_neon};
constexpr simd::family_tables<char_class_kernels> kTables{&kScalar, nullptr, nullptr, nullptr,
                                                          &kNeon};
#else
constexpr simd::family_tables<char_class_kernels> kTables{&kScalar};
#endif
std::atomic<const char_class_kernels*> active_kernels{nullptr};
}  // namespace

const simd::family_tables<char_class_kernels>& char_class_tables() noexcept { return kTables; }

const char_class_kernels& active_char_class_kernels() noexcept {
  return simd::active(kTables, active_kernels);
}

}  // namespace zul::text::detail
