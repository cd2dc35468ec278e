// Text conversion between the host's eight string encodings, through the
// system's converter (host/platform.h): Mac OS Roman, UTF-16 and UTF-32 in host byte order, ISO
// Latin 1, Windows Latin 1, ASCII, UTF-8, and 0xFFFF (bytes without a
// declared encoding, read as ISO Latin 1). Byte-order marks are characters
// like any other: nothing is added or stripped.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace zul_host {

// The bytes of text stored in encoding `from`, re-encoded in `to`; nullopt
// when a byte sequence does not convert or either encoding is not one of the
// eight. Converting to the same encoding is a plain copy, whatever the bytes.
std::optional<std::string> convert_text(std::string_view bytes, std::uint32_t from,
                                        std::uint32_t to);

// True for the eight encodings above.
bool known_encoding(std::uint32_t encoding);

// A readable name: "UTF-8", "Mac OS Roman", "unknown (0xFFFF)", "encoding 0x1234".
std::string encoding_label(std::uint32_t encoding);

}  // namespace zul_host
