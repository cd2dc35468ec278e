// Tag removal: one pass over the bytes; output reserved once for the input
// size + 10 and grown only when a replacement text is longer than the tags
// it stands for. Runs outside tags are copied whole.
#include "encodings/html_tags.h"

#include <cstdint>

namespace zul::encodings {

std::string remove_html_tags(std::string_view utf8, std::string_view replacement) {
  std::string out;
  out.reserve(utf8.size() + 10);
  std::int64_t depth = 0;
  const std::size_t n = utf8.size();
  std::size_t i = 0;
  while (i < n) {
    if (depth == 0) {
      std::size_t run = i;
      while (run < n && utf8[run] != '<' && utf8[run] != '>' && utf8[run] != '\0') ++run;
      out.append(utf8.data() + i, run - i);
      i = run;
      if (i == n) break;
    }
    const char c = utf8[i++];
    if (c == '\0') continue;
    if (c == '<') {
      ++depth;
    } else if (c == '>') {
      --depth;
    } else if (depth != 0) {
      out += replacement;
    } else {
      out += c;
    }
  }
  return out;
}

}  // namespace zul::encodings
