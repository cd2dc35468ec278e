// Mail subject encoding one byte at a time: the reference for
// encodings/mail_subject.h, with the same contract.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "common/size_gate.h"

namespace zul::reference {

std::string encode_mail_subject_reference(std::string_view utf8,
                                          std::uint64_t limit = kMaxResultBytes);

}  // namespace zul::reference
