// Mail subjects as one RFC 2047 encoded word, "=?utf-8?Q?...?=", in the "Q"
// encoding (RFC 2047 section 4.2). A subject of printable ASCII only needs
// no encoding and is kept as it is. The word is never split or folded.
#pragma once

#include <string>
#include <string_view>

#include "common/scan.h"
#include "common/size_gate.h"

namespace zul::encodings {

// True when some byte of the UTF-8 subject is below 32 or above 127 (the
// whole length is checked; a zero byte counts as a control byte).
bool subject_needs_encoding(std::string_view utf8);

// The encoded word for a UTF-8 subject: space becomes "_"; "=", "?", "_",
// bytes 0..31, 127 and 128..255 become "=" and two upper-case hex digits;
// other bytes are kept. Size is at most 3 * size + 12 bytes; a word that
// would pass limit bytes gives "" (encoding stops there). scan is the
// byte-set search to use (tests pass every level's).
std::string encode_mail_subject(std::string_view utf8, std::uint64_t limit = kMaxResultBytes,
                                const scan_kernels& scan = machine_scan());

}  // namespace zul::encodings
