// HTML character references by row-by-row scans of the entity table: the
// references for the indexed look-ups of encodings/html_entities.h and for
// the encoder and decoder of encodings/html.h, following their rules
// directly.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "encodings/html.h"

namespace zul::reference {

// The name of the first table row for cp (only rows from U+00A0 up when
// from_nbsp is set), or an empty view.
std::string_view entity_name_reference(std::uint32_t cp, bool from_nbsp);
// The code point of the first row named exactly name, or nothing.
std::optional<std::uint32_t> entity_code_point_reference(std::string_view name);

std::string encode_html_reference(encodings::code_point_view text, std::int64_t options);
encodings::code_points decode_html_reference(encodings::code_point_view text);

}  // namespace zul::reference
