// Unicode byte-order marks: which mark a run of bytes begins with, and the
// bytes of the mark of each kind. Kinds are the numbers host code uses:
// 0 none, 1 UTF-8 (EF BB BF), 3 UTF-16 big-endian (FE FF), 4 UTF-16
// little-endian (FF FE), 6 UTF-32 big-endian (00 00 FE FF), 7 UTF-32
// little-endian (FF FE 00 00); 2 and 5 are accepted as 4 and 7 when asking
// for a mark but are never detected. Only the first bytes are looked at.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string_view>

namespace zul::text {

// The text form a mark's bytes are handed over in.
enum class marker_form { utf8, utf16, utf32 };

struct unicode_marker {
  std::string_view bytes;  // the mark, in the order it is stored
  marker_form form;
};

// The kind of mark that bytes begins with, 0 when none (also for fewer than
// two bytes). A UTF-32 little-endian mark wins over the UTF-16 one it
// begins with; FF FE followed by anything but 00 00 is UTF-16 little-endian.
std::int64_t detect_unicode_marker(std::span<const std::uint8_t> bytes) noexcept;

// The mark of a kind (2 as 4, 5 as 7), or nothing for 0 and unknown kinds.
std::optional<unicode_marker> unicode_marker_for(std::int64_t kind) noexcept;

}  // namespace zul::text
