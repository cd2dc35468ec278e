// HTML character references over Unicode code points (UTF-32 text).
// Encoding writes markup characters and every character from U+0080 up as
// references (named where the HTML 4.01 table has a row, else "&#N;"),
// producing ASCII. Decoding reads named, "&#N;" and "&#xH;" references
// back; it never rejects input: anything that is not a reference, its "&"
// included, is kept as text. Both drop a leading U+FEFF or U+FFFE.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "common/bytes.h"
#include "common/out_buffer.h"
#include "common/scan.h"
#include "common/size_gate.h"

namespace zul::encodings {

using code_point_view = std::span<const std::uint32_t>;
using code_points = std::vector<std::uint32_t>;

// Code-point results go to the host as UTF-32: four bytes each.
inline constexpr std::uint64_t kMaxResultCodePoints = kMaxResultBytes / 4;

// True when text holds a double quote, "&", an apostrophe, "<", ">" or a
// character above U+007F anywhere in its whole length (a U+0000 does not
// end the check). When false the caller keeps the text as it is.
bool html_needs_escaping(code_point_view text);

// Options: only bit 0 counts. Bit 0 clear: the apostrophe becomes "&#39;",
// the double quote, "&", "<" and ">" their named references. Bit 0 set: the
// five are copied as they are. In both modes characters below U+0020 other
// than tab, LF and CR are dropped, other ASCII is copied, and characters
// from U+0080 up become "&name;" or "&#N;" (decimal). Output is ASCII, at
// most 13 bytes per character; empty text gives an empty result, and so
// does output that would pass limit bytes (encoding stops there). scan is
// the search to use (tests pass every level's). Throws std::bad_alloc when
// memory runs out.
out_buffer encode_html(code_point_view text, std::int64_t options,
                       std::uint64_t limit = kMaxResultBytes,
                       const scan_kernels& scan = machine_scan());

// The same two for ASCII text given as its bytes (the code points of ASCII
// text), which saves widening it to code points first.
bool ascii_html_needs_escaping(bytes_view ascii);
out_buffer encode_ascii_html(bytes_view ascii, std::int64_t options,
                             std::uint64_t limit = kMaxResultBytes,
                             const scan_kernels& scan = machine_scan());

// Decodes references: "&" + name + ";" with a name of 1 to 8 characters (at
// the very end of the text the ";" may be missing). A name of the table
// gives its code point; "#" + decimal digits or "#x" + hex digits give their
// value when it is 1 or more ("-" in the digits negates; characters after
// the digits are ignored). Output is never longer than the input; output
// past limit code points gives an empty result.
code_points decode_html(code_point_view text, std::uint64_t limit = kMaxResultCodePoints,
                        const scan_kernels& scan = machine_scan());

}  // namespace zul::encodings
