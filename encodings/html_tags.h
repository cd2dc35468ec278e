// Removal of markup by counting angle brackets over UTF-8 bytes: every byte
// while the depth ("<" adds one, ">" takes one, never clamped) is not 0 is
// dropped or replaced. No HTML parsing: comments, quotes and scripts get no
// special treatment.
#pragma once

#include <string>
#include <string_view>

#include "common/size_gate.h"

namespace zul::encodings {

// Drops zero bytes and the brackets themselves; writes other bytes when the
// depth is exactly 0, and replacement (possibly empty) for each other byte,
// so replacement appears once per byte inside a tag. Output that would pass
// limit bytes gives "" (the removal stops there).
std::string remove_html_tags(std::string_view utf8, std::string_view replacement,
                             std::uint64_t limit = kMaxResultBytes);

}  // namespace zul::encodings
