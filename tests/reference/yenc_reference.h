// Byte-at-a-time yEnc decoding: the reference that tests, fuzz targets and
// benchmarks compare the shipped decoder with. Not linked into the plug-in.
#pragma once

#include <string>
#include <string_view>

namespace zul::reference {

// "=" takes the next byte as escaped (minus 64), then every byte is reduced
// by 42, modulo 256; a final "=" decodes as if a zero byte followed it.
std::string decode_yenc_reference(std::string_view in);

}  // namespace zul::reference
