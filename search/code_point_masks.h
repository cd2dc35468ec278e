// Match masks of a pattern of at most 64 code points: bit k of masks(c) is
// set when pattern[k] == c. Code points below 256 index a direct table; the
// others go to a small open-addressing table (at most 64 keys in 128 slots,
// so a probe always ends at the key or at an empty slot). Internal to the
// distances of this folder.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

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

}  // namespace zul::search::detail
