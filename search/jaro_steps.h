// The serial core of the one-word Jaro-Winkler matchers on x86-64 (AVX2
// and AVX-512), shared by both levels: the greedy steps on the taken mask,
// and the count of matched pairs that differ. The steps are plain assembly
// with BMI1 instructions, which both levels require, so they inline into
// either level's kernels.
#pragma once

#if defined(__x86_64__) || defined(_M_X64)
#include <bit>
#include <cstddef>
#include <cstdint>
#include <span>

namespace zul::search::detail {

// One greedy step: the lowest open position not yet in t is taken, and
// whether there was one enters f at the top (BLSI sets the carry when its
// source is not zero; RCR shifts it in). Written out in assembly so that
// nothing comes between the two: a flag kept this way costs one operation
// beside the serial chain, where storing the picks and reading them back
// made the last of them wait for their stores.
inline void pick_one(std::uint64_t& t, std::uint64_t& f, std::uint64_t open) {
  std::uint64_t p;
  asm("andn %[o], %[t], %[p]\n\t"
      "blsi %[p], %[p]\n\t"
      "rcr $1, %[f]\n\t"
      "or %[p], %[t]"
      : [t] "+r"(t), [f] "+r"(f), [p] "=&r"(p)
      : [o] "r"(open)
      : "cc");
}

// Two steps in a row, both from the same taken mask t: the second cannot
// take the first one's pick, which only an equal character can hold, so it
// removes that pick and nothing else. Two characters cost five dependent
// steps instead of six.
inline void pick_two(std::uint64_t& t, std::uint64_t& f, std::uint64_t open0, std::uint64_t open1) {
  std::uint64_t p0, p1;
  asm("andn %[o1], %[t], %[p1]\n\t"
      "andn %[o0], %[t], %[p0]\n\t"
      "blsi %[p0], %[p0]\n\t"
      "rcr $1, %[f]\n\t"
      "andn %[p1], %[p0], %[p1]\n\t"
      "or %[p0], %[t]\n\t"
      "blsi %[p1], %[p1]\n\t"
      "rcr $1, %[f]\n\t"
      "or %[p1], %[t]"
      : [t] "+r"(t), [f] "+r"(f), [p0] "=&r"(p0), [p1] "=&r"(p1)
      : [o0] "r"(open0), [o1] "r"(open1)
      : "cc");
}

// The matched pairs that differ, by a walk over both match masks: the
// characters of a at the set bits of matched_a against those of b at the
// set bits of taken, rank by rank (both masks have the same count).
inline std::size_t count_crossed_walk(std::span<const std::uint32_t> a, std::uint64_t matched_a,
                                      std::span<const std::uint32_t> b, std::uint64_t taken) {
  std::size_t crossed = 0;
  for (; taken != 0; taken &= taken - 1, matched_a &= matched_a - 1) {
    crossed += a[static_cast<std::size_t>(std::countr_zero(matched_a))] !=
                       b[static_cast<std::size_t>(std::countr_zero(taken))]
                   ? 1
                   : 0;
  }
  return crossed;
}

}  // namespace zul::search::detail

#endif
