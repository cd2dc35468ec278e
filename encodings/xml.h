// XML text escaping over code points, and the byte test of whether a string
// can go into HTML or XML as it is. Only the five markup characters are
// escaped; every other character, non-ASCII included, is kept (XML 1.0
// section 2.4 requires no more). Decoding is the HTML decoder's (html.h).
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "encodings/html.h"

namespace zul::encodings {

// True when text holds a double quote, "&", an apostrophe, "<" or ">"
// anywhere in its whole length (a U+0000 does not end the check).
bool xml_needs_escaping(code_point_view text);

// Escapes the five markup characters: the apostrophe as "&#39;" (options
// bit 0 clear) or "&apos;" (bit 0 set), the others as "&quot;", "&amp;",
// "&lt;", "&gt;". A leading U+FEFF or U+FFFE is dropped, as are characters
// below U+0020 other than tab, LF and CR; all else is copied. At most 6
// code points per character. scan is the search to use (tests pass every
// level's). Output that would pass limit code points gives
// an empty result (escaping stops there).
code_points encode_xml(code_point_view text, std::int64_t options,
                       std::uint64_t limit = kMaxResultCodePoints,
                       const scan_kernels& scan = machine_scan());

// True when no byte is 0, 128 or more, or one of the five markup bytes (an
// empty text passes). Stops at the first offending byte.
bool is_markup_free_ascii(std::string_view bytes);

}  // namespace zul::encodings
