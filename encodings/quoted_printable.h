// Quoted-printable text after RFC 2045 section 6.7, over bytes as stored.
// The encoder breaks lines before they reach line length - 1 characters
// with a soft break ("=" CR LF), writes every input line break (CR, LF,
// CR LF or LF CR) as CR LF, encodes a space or tab only before a line
// break, and writes "=" and bytes outside 33..126 as "=" and two upper-case
// hex digits. The decoder accepts every byte sequence.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "common/scan.h"
#include "common/size_gate.h"

namespace zul::encodings {

// Encodes in. line_length: the low 32 bits as a signed value; 1 or less
// selects 72. Output of a multi-line input whose last line is not empty
// ends with a soft break. Empty input gives empty output; so does output
// that would pass limit bytes (encoding stops there). scan is the byte-set
// search to use (tests pass every level's).
std::string encode_quoted_printable(std::string_view in, std::int64_t line_length,
                                    std::uint64_t limit = kMaxResultBytes,
                                    const scan_kernels& scan = machine_scan());

// Decodes "=hh" pairs (either case; a pair with a non-digit, or cut off by
// the end, writes nothing), drops soft breaks ("=" before CR/LF, and "="
// before a space or tab together with the rest of its line), and writes
// every hard line break as one LF. A final "=" writes nothing.
std::string decode_quoted_printable(std::string_view in, const scan_kernels& scan = machine_scan());

}  // namespace zul::encodings
