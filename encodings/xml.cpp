// XML escaping: one pass, output reserved once for the worst case (6 code
// points per character), capped at the result limit; the five markup
// characters are the only ones XML 1.0 text needs escaped. The readiness
// test is one byte-set search (vector kernels) for the first byte that is
// not allowed.
#include "encodings/xml.h"

#include "common/byte_set.h"
#include "common/markup.h"
#include "common/size_gate.h"

namespace zul::encodings {
namespace {

// Appends the reference's characters; false, writing nothing, when the
// output would pass limit code points.
bool append(code_points& out, std::string_view ascii, std::uint64_t limit) {
  if (!make_room(out, ascii.size(), limit)) return false;
  out.insert(out.end(), ascii.begin(), ascii.end());
  return true;
}

// Bytes a ready string may not hold: 0, 128 and above, the five markup
// bytes. The check is one byte-set search for the first of them.
constexpr simd::byte_set kNotReady = [] {
  simd::byte_set not_ready;
  for (std::uint32_t b = 0; b < 256; ++b) {
    if (b == 0 || b >= 128 || is_markup(b)) not_ready.add(static_cast<std::uint8_t>(b));
  }
  return not_ready;
}();

}  // namespace

bool xml_needs_escaping(code_point_view text) {
  for (const std::uint32_t c : text) {
    if (is_markup(c)) return true;
  }
  return false;
}

code_points encode_xml(code_point_view text, std::int64_t options, std::uint64_t limit) {
  text = skip_byte_order_mark(text);
  const bool named_apostrophe = (options & 1) != 0;
  code_points out;
  out.reserve(worst_case_reserve(text.size(), 6, 0, limit));
  for (const std::uint32_t c : text) {
    bool fits = true;
    switch (c) {
      case '"':
        fits = append(out, "&quot;", limit);
        break;
      case '&':
        fits = append(out, "&amp;", limit);
        break;
      case '\'':
        fits = append(out, named_apostrophe ? "&apos;" : "&#39;", limit);
        break;
      case '<':
        fits = append(out, "&lt;", limit);
        break;
      case '>':
        fits = append(out, "&gt;", limit);
        break;
      default:
        if (!is_dropped_control(c)) {
          fits = make_room(out, 1, limit);
          if (fits) out.push_back(c);
        }
    }
    if (!fits) return {};
  }
  return out;
}

bool is_markup_free_ascii(std::string_view bytes) {
  return simd::find_first_in_set(kNotReady, bytes_of(bytes)) == bytes.size();
}

}  // namespace zul::encodings
