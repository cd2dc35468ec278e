// Byte-at-a-time percent-encoding and decoding that follow the rules of
// encodings/url.h directly: the references for the table-driven versions.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace zul::reference {

std::string encode_url_reference(std::string_view in, std::int64_t options);
std::string decode_url_reference(std::string_view in, std::int64_t options);

}  // namespace zul::reference
