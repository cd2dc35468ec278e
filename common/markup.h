// Character tests shared by the HTML and XML escapers, over code points: the
// five markup characters, byte-order marks at the start of a text, and the
// control characters that rewritten text drops.
#pragma once

#include <cstdint>
#include <span>

namespace zul {

// The five characters that XML and HTML text must escape: " & ' < >.
constexpr bool is_markup(std::uint32_t c) {
  return c == '"' || c == '&' || c == '\'' || c == '<' || c == '>';
}

// U+FEFF, or U+FFFE (a mark read in the other byte order).
constexpr bool is_byte_order_mark(std::uint32_t c) { return c == 0xFEFF || c == 0xFFFE; }

// text without a leading byte-order mark (one at most is dropped).
inline std::span<const std::uint32_t> skip_byte_order_mark(std::span<const std::uint32_t> text) {
  return !text.empty() && is_byte_order_mark(text[0]) ? text.subspan(1) : text;
}

// Controls other than tab, LF and CR, which rewritten text drops.
constexpr bool is_dropped_control(std::uint32_t c) {
  return c < 32 && c != 9 && c != 10 && c != 13;
}

}  // namespace zul
