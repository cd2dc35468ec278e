// XML escaping: one pass, output reserved once (one code point per input
// character + 4 Ki); the five markup characters are the only ones XML 1.0
// text needs escaped. The readiness test is one table look-up per byte.
#include "encodings/xml.h"

#include <array>

#include "common/markup.h"

namespace zul::encodings {
namespace {

void append(code_points& out, std::string_view ascii) {
  out.insert(out.end(), ascii.begin(), ascii.end());
}

// Bytes a ready string may hold: 1..127 except the five markup bytes.
constexpr std::array<bool, 256> kReadyByte = [] {
  std::array<bool, 256> ready{};
  for (std::uint32_t b = 1; b < 128; ++b) ready[b] = !is_markup(b);
  return ready;
}();

}  // namespace

bool xml_needs_escaping(code_point_view text) {
  for (const std::uint32_t c : text) {
    if (is_markup(c)) return true;
  }
  return false;
}

code_points encode_xml(code_point_view text, std::int64_t options) {
  text = skip_byte_order_mark(text);
  const bool named_apostrophe = (options & 1) != 0;
  code_points out;
  out.reserve(text.size() + 4096);
  for (const std::uint32_t c : text) {
    switch (c) {
      case '"':
        append(out, "&quot;");
        break;
      case '&':
        append(out, "&amp;");
        break;
      case '\'':
        append(out, named_apostrophe ? "&apos;" : "&#39;");
        break;
      case '<':
        append(out, "&lt;");
        break;
      case '>':
        append(out, "&gt;");
        break;
      default:
        if (!is_dropped_control(c)) out.push_back(c);
    }
  }
  return out;
}

bool is_markup_free_ascii(std::string_view bytes) {
  for (const char b : bytes) {
    if (!kReadyByte[static_cast<std::uint8_t>(b)]) return false;
  }
  return true;
}

}  // namespace zul::encodings
