// Hex dumps are sized once, up front, with checked 64-bit arithmetic, so a
// huge linelen * hexlen is refused before anything is allocated. The digit
// text is built once (digits plus exactly the filler the last line needs) and
// copied out group by group, or line by line when there is no spacer.
#include "binary/hex_dump.h"

#include <cstring>

#include "binary/hex.h"
#include "common/size_gate.h"

namespace zul::binary {
namespace {

char* put(char* out, std::string_view text) {
  if (!text.empty()) std::memcpy(out, text.data(), text.size());
  return out + text.size();
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

std::string hex_dump(std::span<const std::uint8_t> input, const hex_dump_layout& layout) {
  const std::uint64_t total = detail::hex_dump_length(input.size(), layout);
  if (total == 0) return {};
  const auto hexlen = static_cast<std::size_t>(layout.hexlen);
  const auto linelen = static_cast<std::size_t>(layout.linelen);
  const std::size_t line_chars = hexlen * linelen;
  const std::string_view filler = layout.filler.empty() ? std::string_view("0") : layout.filler;

  // The digits, then the filler run cut to complete the last line.
  std::string digits(encode_hex(input).view());
  const std::size_t lines = (digits.size() + line_chars - 1) / line_chars;
  const std::size_t pad = lines * line_chars - digits.size();
  digits.reserve(digits.size() + pad);
  for (std::size_t j = 0; j < pad; ++j) digits += filler[j % filler.size()];

  std::string out(total, '\0');
  char* o = out.data();
  const char* h = digits.data();
  for (std::size_t l = 0; l < lines; ++l) {
    o = put(o, layout.linestart);
    if (layout.spacer.empty()) {
      o = put(o, {h, line_chars});
      h += line_chars;
    } else {
      for (std::size_t g = 0; g < linelen; ++g) {
        if (g != 0) o = put(o, layout.spacer);
        o = put(o, {h, hexlen});
        h += hexlen;
      }
    }
    o = put(o, layout.lineend);
  }
  return out;
}

}  // namespace zul::binary
