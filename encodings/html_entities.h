// Look-ups in the named character reference table (html_entities_tables.h)
// in both directions: code point to name for the encoders, name to code
// point for the decoder. Indexed look-ups (binary searches over the table
// and over a copy sorted by name) give exactly what a row-by-row scan of
// the table gives (tests/reference/html_reference.h).
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

namespace zul::encodings {

// The name of the row for code point cp, or an empty view when no row has
// it. With from_nbsp set only rows from U+00A0 up count, so the five markup
// rows (quot, amp, apos, lt, gt) are never returned.
std::string_view entity_name(std::uint32_t cp, bool from_nbsp = false);

// The code point of the row whose name equals name exactly (case-sensitive,
// same length), or nothing.
std::optional<std::uint32_t> entity_code_point(std::string_view name);

}  // namespace zul::encodings
