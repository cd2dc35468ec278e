// yEnc decoding of the data bytes of an encoded part (header, trailer and
// line breaks already removed by the caller). Every byte decodes: "=" takes
// the next byte as escaped (minus 64), then every byte is reduced by 42,
// modulo 256. CR and LF are data like any other byte.
#pragma once

#include <string_view>

#include "common/out_buffer.h"

namespace zul::encodings {

// Decodes in. A final "=" decodes as if a zero byte followed it (0x96).
// Output is never longer than the input.
out_buffer decode_yenc(std::string_view in);

}  // namespace zul::encodings
