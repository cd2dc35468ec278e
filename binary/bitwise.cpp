// Bitwise combination of data with a repeating mask. The mask is first
// repeated (once per call, on the stack) into a pattern of at least
// kMinSegment bytes, or of the data's length when that is shorter; the data
// is then walked in segments that each meet the pattern from its start, and
// every segment is one call of the machine's run kernel
// (binary/bitwise_kernels.h), so masks of every length and offset run at
// vector speed. Nothing is read past either input.
#include "binary/bitwise.h"

#include <algorithm>
#include <array>
#include <cstring>

#include "binary/bitwise_kernels.h"

namespace zul::binary {
namespace detail {
namespace {

// Segments at least this long keep the per-call cost of the run kernel
// small against the bytes it combines.
constexpr std::size_t kMinSegment = 1024;

// Positions 0..255, the byte stream that xor_positions mixes in.
constexpr std::array<std::uint8_t, 256> kPositions = [] {
  std::array<std::uint8_t, 256> ramp{};
  for (std::size_t i = 0; i < ramp.size(); ++i) ramp[i] = static_cast<std::uint8_t>(i);
  return ramp;
}();

void combine_segments(bit_op op, bytes_view data, bytes_view mask, std::size_t start,
                      std::uint8_t* out) {
  const run_kernel run = active_bitwise_kernels().run[static_cast<int>(op)];
  const std::size_t m = mask.size();
  const std::size_t n = data.size();

  // A short mask repeated a whole number of times is the same mask as far as
  // the byte rule goes, and index start < m means the same byte in both.
  // Copies double in length, so building it costs a few memcpy calls.
  std::uint8_t repeated[2 * kMinSegment];  // copies * m < kMinSegment + m
  if (m < kMinSegment && n > m - start) {
    const std::size_t want = std::min(kMinSegment, n + start);
    const std::size_t total = (want + m - 1) / m * m;
    std::memcpy(repeated, mask.data(), m);
    for (std::size_t have = m; have < total;) {
      const std::size_t more = std::min(have, total - have);
      std::memcpy(repeated + have, repeated, more);
      have += more;
    }
    mask = bytes_view(repeated, total);
  }

  std::size_t pos = 0;
  std::size_t k = start;
  while (pos < n) {
    const std::size_t len = std::min(mask.size() - k, n - pos);
    run(data.data() + pos, mask.data() + k, out + pos, len);
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
  combine_segments(op, data, mask, start, out);
}

void xor_positions(std::uint8_t* out, std::size_t n) {
  combine_segments(bit_op::kXor, bytes_view(out, n), kPositions, 0, out);
}

}  // namespace detail

namespace {

// One buffer of the data's size, written once by the run kernel.
out_buffer combine(detail::bit_op op, bytes_view data, bytes_view mask, std::size_t start) {
  out_buffer out(data.size());
  detail::combine_fast(op, data, mask, start, out.extend(data.size()));
  return out;
}

}  // namespace

out_buffer and_with_mask(bytes_view data, bytes_view mask) {
  if (data.empty() || mask.empty()) return out_buffer(0);
  return combine(detail::bit_op::kAnd, data, mask, 0);
}

out_buffer or_with_mask(bytes_view data, bytes_view mask) {
  if (data.empty() || mask.empty()) return out_buffer(0);
  return combine(detail::bit_op::kOr, data, mask, 0);
}

out_buffer xor_with_mask(bytes_view data, bytes_view mask, std::int64_t offset) {
  if (data.empty() || mask.empty()) return out_buffer(0);
  return combine(detail::bit_op::kXor, data, mask, detail::mask_start(offset, mask.size()));
}

out_buffer xor_with_mask_and_position(bytes_view data, bytes_view mask, std::int64_t offset) {
  out_buffer out = xor_with_mask(data, mask, offset);
  detail::xor_positions(out.data(), out.size());
  return out;
}

}  // namespace zul::binary
