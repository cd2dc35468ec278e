// Match masks of a pattern of at most 64 code points: bit k of masks(c) is
// set when pattern[k] == c. Code points below 256 index a direct table; the
// others go to a small open-addressing table (at most 64 keys in 128 slots,
// so a probe always ends at the key or at an empty slot). Internal to the
// distances of this folder.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <span>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace zul::search::detail {

class code_point_masks {
 public:
  // Masks of pattern (1 to 64 code points), to be looked up only with code
  // points of pattern or of text. A short text is the common case, where
  // filling the 2 KiB direct table would cost more than the whole distance:
  // only the entries that lookups can reach are cleared then.
  code_point_masks(std::span<const std::uint32_t> pattern,
                   std::span<const std::uint32_t> text) noexcept {
    if (text.size() + pattern.size() > 64) {
      for (auto& m : direct_) m = 0;
    } else {
      for (const std::uint32_t c : text) {
        if (c < kDirect) direct_[c] = 0;
      }
    }
    for (const std::uint32_t c : pattern) {
      if (c < kDirect) {
        direct_[c] = 0;
      } else if (!wide_) {
        wide_ = true;
        for (auto& u : used_) u = false;
      }
    }
    for (std::size_t k = 0; k < pattern.size(); ++k) {
      slot_for(pattern[k]) |= std::uint64_t{1} << k;
    }
  }

  std::uint64_t operator()(std::uint32_t c) const noexcept {
    if (c < kDirect) return direct_[c];
    if (!wide_) return 0;
    for (std::size_t s = hash(c);; s = (s + 1) % kSlots) {
      if (!used_[s]) return 0;
      if (keys_[s] == c) return masks_[s];
    }
  }

 private:
  static constexpr std::size_t kDirect = 256;
  static constexpr std::size_t kSlots = 128;
  static std::size_t hash(std::uint32_t c) noexcept { return (c * 2654435761u) >> 25; }

  std::uint64_t& slot_for(std::uint32_t c) noexcept {
    if (c < kDirect) return direct_[c];
    std::size_t s = hash(c);
    while (used_[s] && keys_[s] != c) s = (s + 1) % kSlots;
    if (!used_[s]) {
      used_[s] = true;
      keys_[s] = c;
      masks_[s] = 0;
    }
    return masks_[s];
  }

  // Left uninitialised on purpose: the constructor writes every entry that a
  // lookup may read (see above).
  std::uint64_t direct_[kDirect];
  std::uint32_t keys_[kSlots];
  std::uint64_t masks_[kSlots];
  bool used_[kSlots];
  bool wide_ = false;
};

#if defined(__SSE2__)
// Match masks of a pattern of at most 4 * Registers code points, found by
// comparing c with the whole pattern at once (SSE2, the x86-64 baseline):
// nothing to build or clear, and wide code points cost no more than bytes.
// For short patterns, where the table's set-up would cost more than the
// distance itself.
template <int Registers>
class short_pattern_masks {
 public:
  static constexpr std::size_t kMax = 4 * Registers;

  explicit short_pattern_masks(std::span<const std::uint32_t> pattern) noexcept
      : valid_((std::uint32_t{1} << pattern.size()) - 1) {
    std::uint32_t padded[kMax] = {};
    std::memcpy(padded, pattern.data(), pattern.size() * sizeof(std::uint32_t));
    for (int r = 0; r < Registers; ++r) {
      pattern_[r] = _mm_loadu_si128(reinterpret_cast<const __m128i*>(padded + 4 * r));
    }
  }

  std::uint64_t operator()(std::uint32_t c) const noexcept {
    const __m128i x = _mm_set1_epi32(static_cast<int>(c));
    std::uint32_t m = 0;
    for (int r = 0; r < Registers; ++r) {
      const __m128 eq = _mm_castsi128_ps(_mm_cmpeq_epi32(pattern_[r], x));
      m |= static_cast<std::uint32_t>(_mm_movemask_ps(eq)) << (4 * r);
    }
    return m & valid_;  // padding lanes hold 0, which c may equal
  }

 private:
  __m128i pattern_[Registers];
  std::uint32_t valid_;
};
#endif

}  // namespace zul::search::detail
