// Removal of markup by counting angle brackets over UTF-8 bytes: every byte
// while the depth ("<" adds one, ">" takes one, never clamped) is not 0 is
// dropped or replaced. No HTML parsing: comments, quotes and scripts get no
// special treatment.
#pragma once

#include <string>
#include <string_view>

#include "common/out_buffer.h"
#include "common/scan.h"

namespace zul::encodings {

// Drops zero bytes and the brackets themselves; writes other bytes when the
// depth is exactly 0, and replacement (possibly empty) for each other byte,
// so replacement appears once per byte inside a tag.
// Output that would pass limit bytes gives "" (the removal stops there).
// Throws std::bad_alloc when memory runs out. level picks the kernels (the
// block kernel where it has one, else its byte-set search).
out_buffer remove_html_tags(std::string_view utf8, std::string_view replacement,
                            std::uint64_t limit = kMaxResultBytes,
                            simd::isa level = simd::best_isa());

}  // namespace zul::encodings
