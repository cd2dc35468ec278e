// Byte-set search: the scalar path (the fallback and the reference of the
// kernels) and the one-time choice of kernel. SSE2 alone has no byte
// shuffle, so its kernel compares with the set's ranges; SSSE3, AVX2,
// AVX-512 and NEON shuffle.
#include "common/byte_set.h"

#include <atomic>

namespace zul::simd {

byte_set make_byte_set(bytes_view members) noexcept {
  byte_set set;
  for (std::uint8_t b : members) set.add(b);
  return set;
}

namespace detail {

std::size_t find_first_in_set_scalar(const byte_set& set, const std::uint8_t* p,
                                     std::size_t n) noexcept {
  for (std::size_t i = 0; i < n; ++i) {
    if (set.contains(p[i])) return i;
  }
  return n;
}

std::size_t find_first_code_point_scalar(const byte_set& set, const std::uint32_t* p,
                                         std::size_t n) noexcept {
  for (std::size_t i = 0; i < n; ++i) {
    if (set.contains(static_cast<std::uint8_t>(p[i] > 255 ? 255 : p[i]))) return i;
  }
  return n;
}

std::size_t narrow_until_member_scalar(const byte_set& set, const std::uint32_t* p, std::size_t n,
                                       std::uint8_t* out) noexcept {
  for (std::size_t i = 0; i < n; ++i) {
    const auto b = static_cast<std::uint8_t>(p[i] > 255 ? 255 : p[i]);
    if (set.contains(b)) return i;
    out[i] = b;
  }
  return n;
}

namespace {
constexpr byte_set_kernels kScalar{find_first_in_set_scalar, find_first_code_point_scalar,
                                   narrow_until_member_scalar};
#if defined(__x86_64__) || defined(_M_X64)
// The SSE2 and SSSE3 levels search code-point lanes on the scalar path.
constexpr byte_set_kernels kSse2{find_first_in_set_sse2, find_first_code_point_scalar,
                                 narrow_until_member_scalar};
constexpr byte_set_kernels kSsse3{find_first_in_set_ssse3, find_first_code_point_scalar,
                                  narrow_until_member_scalar};
constexpr byte_set_kernels kAvx2{find_first_in_set_avx2, find_first_code_point_avx2,
                                 narrow_until_member_avx2};
constexpr byte_set_kernels kAvx512{find_first_in_set_avx512, find_first_code_point_avx512,
                                   narrow_until_member_avx512};
constexpr family_tables<byte_set_kernels> kTables{&kScalar, &kSse2,  &kAvx2,
                                                  &kAvx512, nullptr, &kSsse3};
#elif defined(__aarch64__)
// Code-point lanes take the scalar path on arm64 for now.
constexpr byte_set_kernels kNeon{find_first_in_set_neon, find_first_code_point_neon,
                                 narrow_until_member_neon};
constexpr family_tables<byte_set_kernels> kTables{&kScalar, nullptr, nullptr, nullptr, &kNeon};
#else
constexpr family_tables<byte_set_kernels> kTables{&kScalar};
#endif
std::atomic<const byte_set_kernels*> active_kernels{nullptr};
}  // namespace

const family_tables<byte_set_kernels>& byte_set_tables() noexcept { return kTables; }

}  // namespace detail

std::size_t find_first_in_set(const byte_set& set, const std::uint8_t* p, std::size_t n) noexcept {
  return active(detail::byte_set_tables(), detail::active_kernels).find_first(set, p, n);
}

std::size_t find_first_code_point_in_set(const byte_set& set, const std::uint32_t* p,
                                         std::size_t n) noexcept {
  return active(detail::byte_set_tables(), detail::active_kernels).find_first_code_point(set, p, n);
}

}  // namespace zul::simd
