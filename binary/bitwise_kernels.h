// Bitwise run kernels: out[i] = a[i] op b[i] for i < n, with op AND, OR or
// XOR. The mask walk in bitwise.cpp cuts the work into long runs that each
// meet the (repeated) mask from a fixed place; these kernels do the runs.
// One table per level, chosen once per process.
#pragma once

#include <cstddef>
#include <cstdint>

#include "common/dispatch.h"

namespace zul::binary::detail {

using run_kernel = void (*)(const std::uint8_t* a, const std::uint8_t* b, std::uint8_t* out,
                            std::size_t n) noexcept;

// Indexed by bit_op: AND, OR, XOR. out may equal a or b.
struct bitwise_kernels {
  run_kernel run[3];
};

const simd::family_tables<bitwise_kernels>& bitwise_tables() noexcept;
const bitwise_kernels& active_bitwise_kernels() noexcept;

// Level tables, defined beside their kernels.
extern const bitwise_kernels kBitwiseScalar;
extern const bitwise_kernels kBitwiseAvx2;
extern const bitwise_kernels kBitwiseAvx512;
extern const bitwise_kernels kBitwiseNeon;

}  // namespace zul::binary::detail
