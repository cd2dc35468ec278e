// The byte search's vector prefix skip, written with the compilers' generic
// vector types (GCC and Clang, every target) rather than one instruction
// set's intrinsics. Per 16-byte lane vector: one subtract and one unsigned
// compare per range, one compare per set byte, OR-ed into a hit mask; two
// vectors (32 bytes) per round, stopping at the first round with any hit.
#include "search/byte_search_simd.h"

#include <cstring>

namespace zul::search::detail {
namespace {

typedef std::uint8_t u8x16 __attribute__((vector_size(16)));

inline u8x16 load(const std::uint8_t* p) {
  u8x16 v;
  std::memcpy(&v, p, sizeof v);
  return v;
}

inline u8x16 hits(u8x16 v, const vector_matcher& m) {
  u8x16 hit = {};
  for (int i = 0; i < m.ranges; ++i) hit |= (u8x16)((u8x16)(v - m.low[i]) <= m.span[i]);
  for (int i = 0; i < m.set_size; ++i) hit |= (u8x16)(v == m.set[i]);
  return hit;
}

inline bool any(u8x16 v) {
  std::uint64_t halves[2];
  std::memcpy(halves, &v, sizeof halves);
  return (halves[0] | halves[1]) != 0;
}

}  // namespace

std::size_t skip_unmatched_prefix(std::span<const std::uint8_t> target, const vector_matcher& m) {
  const std::uint8_t* p = target.data();
  std::size_t done = 0;
  while (target.size() - done >= 32) {
    if (any(hits(load(p + done), m) | hits(load(p + done + 16), m))) break;
    done += 32;
  }
  return done;
}

}  // namespace zul::search::detail
