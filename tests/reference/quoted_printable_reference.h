// Quoted-printable one byte at a time, written for clarity, not speed: the
// references for the encoder and decoder of encodings/quoted_printable.h,
// with the same contracts.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "common/size_gate.h"

namespace zul::reference {

std::string encode_quoted_printable_reference(std::string_view in, std::int64_t line_length,
                                              std::uint64_t limit = kMaxResultBytes);
std::string decode_quoted_printable_reference(std::string_view in);

}  // namespace zul::reference
