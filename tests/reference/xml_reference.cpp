// One character at a time, written for clarity, not speed.
#include "tests/reference/xml_reference.h"

#include <string_view>

#include "common/markup.h"

namespace zul::reference {

encodings::code_points encode_xml_reference(encodings::code_point_view text, std::int64_t options) {
  text = skip_byte_order_mark(text);
  encodings::code_points out;
  for (const std::uint32_t c : text) {
    std::string_view reference;
    switch (c) {
      case '"':
        reference = "&quot;";
        break;
      case '&':
        reference = "&amp;";
        break;
      case '\'':
        reference = (options & 1) != 0 ? "&apos;" : "&#39;";
        break;
      case '<':
        reference = "&lt;";
        break;
      case '>':
        reference = "&gt;";
        break;
      default:
        if (!is_dropped_control(c)) out.push_back(c);
        continue;
    }
    out.insert(out.end(), reference.begin(), reference.end());
  }
  return out;
}

}  // namespace zul::reference
