// Bitwise runs: the scalar path (eight bytes per step through memcpy, so
// nothing is read past either input) and the one-time choice of kernels.
#include "binary/bitwise_kernels.h"

#include <atomic>
#include <cstring>

namespace zul::binary::detail {
namespace {

template <class Op>
void run_scalar(const std::uint8_t* a, const std::uint8_t* b, std::uint8_t* out,
                std::size_t n) noexcept {
  std::size_t i = 0;
  for (; i + 8 <= n; i += 8) {
    std::uint64_t x, y;
    std::memcpy(&x, a + i, 8);
    std::memcpy(&y, b + i, 8);
    x = Op{}(x, y);
    std::memcpy(out + i, &x, 8);
  }
  for (; i < n; ++i) out[i] = static_cast<std::uint8_t>(Op{}(a[i], b[i]));
}

struct and_op {
  template <class T>
  T operator()(T x, T y) const {
    return static_cast<T>(x & y);
  }
};
struct or_op {
  template <class T>
  T operator()(T x, T y) const {
    return static_cast<T>(x | y);
  }
};
struct xor_op {
  template <class T>
  T operator()(T x, T y) const {
    return static_cast<T>(x ^ y);
  }
};

std::atomic<const bitwise_kernels*> active_kernels{nullptr};

}  // namespace

const bitwise_kernels kBitwiseScalar{{run_scalar<and_op>, run_scalar<or_op>, run_scalar<xor_op>}};

const simd::family_tables<bitwise_kernels>& bitwise_tables() noexcept {
#if defined(__x86_64__) || defined(_M_X64)
  static const simd::family_tables<bitwise_kernels> tables{&kBitwiseScalar, nullptr, &kBitwiseAvx2,
                                                           &kBitwiseAvx512};
#elif defined(__aarch64__)
  static const simd::family_tables<bitwise_kernels> tables{&kBitwiseScalar, nullptr, nullptr,
                                                           nullptr, &kBitwiseNeon};
#else
  static const simd::family_tables<bitwise_kernels> tables{&kBitwiseScalar};
#endif
  return tables;
}

const bitwise_kernels& active_bitwise_kernels() noexcept {
  return simd::active(bitwise_tables(), active_kernels);
}

}  // namespace zul::binary::detail
