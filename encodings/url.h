// Percent-encoding of bytes for URLs and its inverse. Bytes are taken as
// stored, whatever their text encoding. The unreserved set is this library's
// own: letters, digits and "!*-.@_"; every other byte becomes "%" and two
// upper-case hex digits (RFC 3986 section 2.1 notation). Space and "+" follow
// the call's options only; nothing is shared between calls.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "common/out_buffer.h"
#include "common/scan.h"

namespace zul::encodings {

// Options bits (only options & 3 count):
//   0: space -> "%20", "+" kept;   1: space -> "+", "+" -> "%2B";
//   2: space -> "%20", "+" -> "%2B";  3: as 0.
// The decoder turns "+" into a space when bit 0 is set.

// Percent-encodes every byte of in. Output is at most 3 * size bytes; an
// output longer than limit bytes gives "" (room for it is reserved, never
// touched). Throws std::bad_alloc when memory runs out. scan is the byte-set
// search to use (tests pass every level's).
out_buffer encode_url(std::string_view in, std::int64_t options,
                      std::uint64_t limit = kMaxResultBytes,
                      const scan_kernels& scan = machine_scan());

// Decodes "%hh" sequences. Never rejects input: a non-hex digit counts as 0,
// the two bytes after "%" are always consumed, and a "%" within the last two
// bytes reads missing digits as 0 (nothing past the end is read). Output is
// at most in.size() bytes.
out_buffer decode_url(std::string_view in, std::int64_t options,
                      const scan_kernels& scan = machine_scan());

}  // namespace zul::encodings
