// Byte-at-a-time tag removal: the reference for encodings/html_tags.h.
#pragma once

#include <string>
#include <string_view>

namespace zul::reference {

// Depth counts "<" up and ">" down; brackets and zero bytes vanish, other
// bytes are kept at depth 0 and become replacement elsewhere.
std::string remove_html_tags_reference(std::string_view utf8, std::string_view replacement);

}  // namespace zul::reference
