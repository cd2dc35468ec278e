// Byte-class kernels: the printable filter (every byte outside 20..7F
// becomes the replacement). One table per level, chosen once per process.
// The class tests themselves are byte-set searches (common/byte_set.h).
#pragma once

#include <cstddef>
#include <cstdint>

#include "common/dispatch.h"

namespace zul::text::detail {

struct char_class_kernels {
  // out[i] = in[i] when 0x20 <= in[i] <= 0x7F, else replacement; i < n.
  void (*replace_non_printable)(const std::uint8_t* in, std::size_t n, std::uint8_t replacement,
                                std::uint8_t* out) noexcept;
};

const simd::family_tables<char_class_kernels>& char_class_tables() noexcept;
const char_class_kernels& active_char_class_kernels() noexcept;

void replace_non_printable_scalar(const std::uint8_t* in, std::size_t n, std::uint8_t replacement,
                                  std::uint8_t* out) noexcept;
void replace_non_printable_avx2(const std::uint8_t* in, std::size_t n, std::uint8_t replacement,
                                std::uint8_t* out) noexcept;
void replace_non_printable_avx512(const std::uint8_t* in, std::size_t n, std::uint8_t replacement,
                                  std::uint8_t* out) noexcept;
void replace_non_printable_neon(const std::uint8_t* in, std::size_t n, std::uint8_t replacement,
                                std::uint8_t* out) noexcept;

}  // namespace zul::text::detail
