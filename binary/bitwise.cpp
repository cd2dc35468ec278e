// Word-at-a-time bitwise combination of data with a repeating mask. Masks of
// 1, 2, 4 or 8 bytes become one 64-bit pattern word; any other mask is walked
// in segments that each meet the mask from its start, combined eight bytes
// at a time (the compiler widens these loops to vector registers). Loads and
// stores go through memcpy, so nothing is read past either input.
#include "binary/bitwise.h"

#include <algorithm>
#include <array>
#include <cstring>

namespace zul::binary {
namespace detail {
namespace {

constexpr std::size_t kWord = 8;
// Short masks are first repeated into a pattern at least this long, so that
// segments stay long enough for the word loop to pay off.
constexpr std::size_t kMinSegment = 64;

// Positions 0..255, the byte stream that xor_positions mixes in.
constexpr std::array<std::uint8_t, 256> kPositions = [] {
  std::array<std::uint8_t, 256> ramp{};
  for (std::size_t i = 0; i < ramp.size(); ++i) ramp[i] = static_cast<std::uint8_t>(i);
  return ramp;
}();

struct and_op {
  template <class T>
  T operator()(T a, T b) const {
    return static_cast<T>(a & b);
  }
};
struct or_op {
  template <class T>
  T operator()(T a, T b) const {
    return static_cast<T>(a | b);
  }
};
struct xor_op {
  template <class T>
  T operator()(T a, T b) const {
    return static_cast<T>(a ^ b);
  }
};

std::uint64_t load(const std::uint8_t* p) {
  std::uint64_t w;
  std::memcpy(&w, p, kWord);
  return w;
}
void store(std::uint8_t* p, std::uint64_t w) { std::memcpy(p, &w, kWord); }

// out[i] = a[i] op b[i] for i < n: whole words, then the bytes left over.
template <class Op>
void combine_run(Op op, const std::uint8_t* a, const std::uint8_t* b, std::uint8_t* out,
                 std::size_t n) {
  std::size_t i = 0;
  for (; i + kWord <= n; i += kWord) store(out + i, op(load(a + i), load(b + i)));
  for (; i < n; ++i) out[i] = op(a[i], b[i]);
}

// A mask whose length divides 8 repeats exactly once per word: build that
// word (starting at mask index start) and apply it to every word of data.
template <class Op>
void combine_pattern_word(Op op, bytes_view data, bytes_view mask, std::size_t start,
                          std::uint8_t* out) {
  std::uint8_t pattern[kWord];
  for (std::size_t j = 0; j < kWord; ++j) pattern[j] = mask[(start + j) % mask.size()];
  const std::uint64_t word = load(pattern);
  const std::size_t n = data.size();
  std::size_t i = 0;
  for (; i + kWord <= n; i += kWord) store(out + i, op(load(data.data() + i), word));
  for (; i < n; ++i) out[i] = op(data[i], pattern[i % kWord]);
}

template <class Op>
void combine_segments(Op op, bytes_view data, bytes_view mask, std::size_t start,
                      std::uint8_t* out) {
  const std::size_t m = mask.size();
  if (kWord % m == 0) return combine_pattern_word(op, data, mask, start, out);

  // A short mask repeated a whole number of times is the same mask as far as
  // the byte rule goes, and index start < m means the same byte in both.
  std::uint8_t repeated[2 * kMinSegment];  // copies * m < kMinSegment + m
  if (m < kMinSegment && data.size() > m) {
    const std::size_t copies = (kMinSegment + m - 1) / m;
    for (std::size_t j = 0; j < copies * m; ++j) repeated[j] = mask[j % m];
    mask = bytes_view(repeated, copies * m);
  }

  const std::size_t n = data.size();
  std::size_t pos = 0;
  std::size_t k = start;
  while (pos < n) {
    const std::size_t len = std::min(mask.size() - k, n - pos);
    combine_run(op, data.data() + pos, mask.data() + k, out + pos, len);
    pos += len;
    k = 0;  // the mask walk wraps to its first byte, never back to start
  }
}

}  // namespace

std::size_t mask_start(std::int64_t offset, std::size_t m) {
  const auto len = static_cast<std::int64_t>(m);
  const std::int64_t r = offset % len;
  return static_cast<std::size_t>(r < 0 ? r + len : r);
}

void combine_fast(bit_op op, bytes_view data, bytes_view mask, std::size_t start,
                  std::uint8_t* out) {
  switch (op) {
    case bit_op::kAnd:
      return combine_segments(and_op{}, data, mask, start, out);
    case bit_op::kOr:
      return combine_segments(or_op{}, data, mask, start, out);
    case bit_op::kXor:
      return combine_segments(xor_op{}, data, mask, start, out);
  }
}

void xor_positions(std::uint8_t* out, std::size_t n) {
  combine_segments(xor_op{}, bytes_view(out, n), kPositions, 0, out);
}

}  // namespace detail

namespace {

std::string combine(detail::bit_op op, bytes_view data, bytes_view mask, std::size_t start) {
  std::string out(data.size(), '\0');
  detail::combine_fast(op, data, mask, start, reinterpret_cast<std::uint8_t*>(out.data()));
  return out;
}

}  // namespace

std::string and_with_mask(bytes_view data, bytes_view mask) {
  if (data.empty() || mask.empty()) return {};
  return combine(detail::bit_op::kAnd, data, mask, 0);
}

std::string or_with_mask(bytes_view data, bytes_view mask) {
  if (data.empty() || mask.empty()) return {};
  return combine(detail::bit_op::kOr, data, mask, 0);
}

std::string xor_with_mask(bytes_view data, bytes_view mask, std::int64_t offset) {
  if (data.empty() || mask.empty()) return {};
  return combine(detail::bit_op::kXor, data, mask, detail::mask_start(offset, mask.size()));
}

std::string xor_with_mask_and_position(bytes_view data, bytes_view mask, std::int64_t offset) {
  std::string out = xor_with_mask(data, mask, offset);
  detail::xor_positions(reinterpret_cast<std::uint8_t*>(out.data()), out.size());
  return out;
}

}  // namespace zul::binary
