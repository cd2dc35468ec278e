// Tag removal: one pass over the bytes; output reserved once for the worst
// case (every byte replaced), capped at the result limit, where removal
// stops. Runs outside tags are copied whole.
#include "encodings/html_tags.h"

#include <algorithm>
#include <cstdint>

namespace zul::encodings {

std::string remove_html_tags(std::string_view utf8, std::string_view replacement,
                             std::uint64_t limit) {
  std::string out;
  out.reserve(
      worst_case_reserve(utf8.size(), std::max<std::size_t>(replacement.size(), 1), 10, limit));
  std::int64_t depth = 0;
  const std::size_t n = utf8.size();
  std::size_t i = 0;
  while (i < n) {
    if (depth == 0) {
      std::size_t run = i;
      while (run < n && utf8[run] != '<' && utf8[run] != '>' && utf8[run] != '\0') ++run;
      if (!make_room(out, run - i, limit)) return {};
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
      if (!make_room(out, replacement.size(), limit)) return {};
      out += replacement;
    } else {
      if (!make_room(out, 1, limit)) return {};
      out += c;
    }
  }
  return out;
}

}  // namespace zul::encodings
