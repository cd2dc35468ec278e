// Hex dumps are sized once, up front, with checked 64-bit arithmetic, so a
// huge linelen * hexlen is refused before anything is allocated, and written
// into a result buffer of exactly that size (plus a little slack for
// fixed-size stores), never zero-filled. Lines go out in batches: the hex
// kernel writes a batch's digits into a small scratch buffer that stays in
// cache (an even number of lines always starts on a whole byte), and the
// lines are cut from it with fixed 16-byte copies where texts and groups
// are that short. The usual layout of one-byte groups and a one-character
// spacer skips the scratch: the hex kernel writes each byte as its two
// digits and the spacer straight into the line.
#include "binary/hex_dump.h"

#include <algorithm>
#include <cstring>
#include <memory>

#include "binary/hex.h"
#include "common/size_gate.h"

namespace zul::binary {
namespace {

// Room past the dump, and past the scratch digits, for 16-byte copies.
constexpr std::size_t kSlack = 16;
// Digits per batch of lines: small enough to stay in the first-level cache.
constexpr std::size_t kBatchDigits = 16384;

// A line text (start, end, spacer) written by one 16-byte copy when it is
// that short; the destination must have 16 bytes of room.
class short_text {
 public:
  explicit short_text(std::string_view text) : text_(text) {
    if (!text.empty() && text.size() <= sizeof padded_) {
      std::memcpy(padded_, text.data(), text.size());
    }
  }
  char* put(char* out) const {
    if (text_.size() <= sizeof padded_) {
      std::memcpy(out, padded_, sizeof padded_);
    } else {
      std::memcpy(out, text_.data(), text_.size());
    }
    return out + text_.size();
  }

 private:
  std::string_view text_;
  char padded_[16] = {};
};

// One group of digits; h and out have 16 bytes of room.
char* put_group(char* out, const char* h, std::size_t hexlen) {
  if (hexlen <= 16) {
    std::memcpy(out, h, 16);
  } else {
    std::memcpy(out, h, hexlen);
  }
  return out + hexlen;
}

}  // namespace

namespace detail {

std::uint64_t hex_dump_length(std::uint64_t input_size, const hex_dump_layout& layout) {
  if (input_size == 0 || layout.hexlen < 1 || layout.linelen < 1) return 0;
  const auto hexlen = static_cast<std::uint64_t>(layout.hexlen);
  const auto linelen = static_cast<std::uint64_t>(layout.linelen);
  result_size line(kMaxDumpLength);
  line.add(layout.linestart.size()).add(layout.lineend.size());
  line.add_times(hexlen, linelen).add_times(linelen - 1, layout.spacer.size());
  if (!line.fits()) return 0;
  // hexlen * linelen fits: it is part of the line.
  const std::uint64_t groups_chars = hexlen * linelen;
  const std::uint64_t digits = 2 * input_size;  // a span's size is below 2^63
  const std::uint64_t lines = digits / groups_chars + (digits % groups_chars != 0);
  return result_size(kMaxDumpLength).add_times(lines, line.bytes()).bytes();
}

}  // namespace detail

out_buffer hex_dump(std::span<const std::uint8_t> input, const hex_dump_layout& layout,
                    const detail::hex_kernels& kernels) {
  const std::uint64_t total = detail::hex_dump_length(input.size(), layout);
  if (total == 0) return out_buffer(0);
  const auto hexlen = static_cast<std::size_t>(layout.hexlen);
  const auto linelen = static_cast<std::size_t>(layout.linelen);
  const std::size_t line_chars = hexlen * linelen;
  const std::size_t n = input.size();
  const std::size_t lines = (2 * n + line_chars - 1) / line_chars;
  out_buffer out(static_cast<std::size_t>(total) + kSlack);
  char* const first = reinterpret_cast<char*>(out.tail());
  char* o = first;
  const short_text start(layout.linestart), end(layout.lineend), spacer(layout.spacer);
  std::size_t line = 0;
  if (hexlen == 2 && layout.spacer.size() == 1 && linelen > 1) {
    // Every line but the last: linelen bytes, each "XY" + spacer, the last
    // spacer overwritten by the line end.
    const std::uint8_t* in = input.data();
    for (; line + 1 < lines; ++line, in += linelen) {
      o = start.put(o);
      kernels.spaced_pairs(in, linelen, layout.spacer[0], o);
      o = end.put(o + 3 * linelen - 1);
    }
  }
  // The remaining lines through the scratch digits, in batches of an even
  // number of lines.
  const std::size_t batch_lines = 2 * std::max<std::size_t>(1, kBatchDigits / (2 * line_chars));
  const std::string_view filler = layout.filler.empty() ? std::string_view("0") : layout.filler;
  std::unique_ptr<char[]> scratch;
  std::size_t scratch_size = 0;
  while (line < lines) {
    const std::size_t count = std::min(batch_lines, lines - line);
    // A batch starts on a whole byte: after an even number of lines, or
    // after the fast path's lines of whole bytes.
    const std::size_t from = line * line_chars / 2;
    const std::size_t digits = count * line_chars;
    const std::size_t bytes = std::min(n - from, (digits + 1) / 2);
    if (scratch_size < digits + 2 + kSlack) {
      scratch_size = digits + 2 + kSlack;
      scratch.reset(new char[scratch_size]);
    }
    char* h = scratch.get();
    kernels.encode(input.data() + from, bytes, h);
    // Filler completes the last line, counted from the end of the digits.
    for (std::size_t k = 2 * bytes, j = 0; k < digits; ++k, ++j) h[k] = filler[j % filler.size()];
    for (std::size_t l = 0; l < count; ++l) {
      o = start.put(o);
      if (layout.spacer.empty()) {
        std::memcpy(o, h, line_chars);
        o += line_chars;
        h += line_chars;
      } else {
        for (std::size_t g = 0; g < linelen; ++g) {
          if (g != 0) o = spacer.put(o);
          o = put_group(o, h, hexlen);
          h += hexlen;
        }
      }
      o = end.put(o);
    }
    line += count;
  }
  out.commit(static_cast<std::size_t>(o - first));
  return out;
}

}  // namespace zul::binary
