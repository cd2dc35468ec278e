// Written for clarity, not speed.
#include "tests/reference/hex_dump_reference.h"

#include <cstring>
#include <string_view>

#include "binary/hex.h"

namespace zul::reference {
namespace {

char* put(char* out, std::string_view text) {
  if (!text.empty()) std::memcpy(out, text.data(), text.size());
  return out + text.size();
}

}  // namespace

std::string hex_dump_reference(std::span<const std::uint8_t> input,
                               const binary::hex_dump_layout& layout) {
  const std::uint64_t total = binary::detail::hex_dump_length(input.size(), layout);
  if (total == 0) return {};
  const auto hexlen = static_cast<std::size_t>(layout.hexlen);
  const auto linelen = static_cast<std::size_t>(layout.linelen);
  const std::size_t line_chars = hexlen * linelen;
  const std::string_view filler = layout.filler.empty() ? std::string_view("0") : layout.filler;

  // The digits, then the filler run cut to complete the last line.
  std::string digits(binary::encode_hex(input).view());
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

}  // namespace zul::reference
