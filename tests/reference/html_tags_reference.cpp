#include "tests/reference/html_tags_reference.h"

#include <cstdint>

namespace zul::reference {

std::string remove_html_tags_reference(std::string_view utf8, std::string_view replacement) {
  std::string out;
  std::int64_t depth = 0;
  for (const char c : utf8) {
    if (c == '\0') continue;
    if (c == '<') {
      ++depth;
    } else if (c == '>') {
      --depth;
    } else if (depth == 0) {
      out += c;
    } else {
      out += replacement;
    }
  }
  return out;
}

}  // namespace zul::reference
