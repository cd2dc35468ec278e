// XML escaping one character at a time, following the escaper's rules
// directly: the reference for encodings/xml.h.
#pragma once

#include <cstdint>

#include "encodings/html.h"

namespace zul::reference {

encodings::code_points encode_xml_reference(encodings::code_point_view text, std::int64_t options);

}  // namespace zul::reference
