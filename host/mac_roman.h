// Mac OS Roman, converted by the stand-in host itself on every platform. The
// system converters disagree on a few bytes (0xBD is U+03A9 in glibc and
// U+2126 in the Windows code page 10000; 0xF0 is a private-use character of
// each one's own), and the host must give the same text everywhere. The
// mapping is the one macOS uses: 0xBD the Greek capital omega, 0xDB the euro
// sign, 0xF0 U+F8FF.
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace zul_host {

// Mac OS Roman bytes as UTF-32 in host byte order; every byte has a character.
std::string mac_roman_to_utf32(std::string_view bytes);

// UTF-32 in host byte order as Mac OS Roman; nullopt when a character has no
// byte or the length is not a whole number of characters.
std::optional<std::string> utf32_to_mac_roman(std::string_view utf32);

}  // namespace zul_host
