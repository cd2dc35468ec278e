// Byte-order mark detection and construction. Detection decides on at most
// the first four bytes: four-byte UTF-32 marks are tried first when there are
// four bytes, then the two- and three-byte marks.
#include "text/markers.h"

namespace zul::text {

std::int64_t detect_unicode_marker(std::span<const std::uint8_t> bytes) noexcept {
  const std::size_t len = bytes.size();
  if (len < 2) return 0;
  const std::uint8_t b0 = bytes[0], b1 = bytes[1];
  if (len >= 4) {
    const std::uint8_t b2 = bytes[2], b3 = bytes[3];
    if (b0 == 0xFF) return b1 != 0xFE ? 0 : (b2 == 0x00 && b3 == 0x00) ? 7 : 4;
    if (b0 == 0x00) return (b1 == 0x00 && b2 == 0xFE && b3 == 0xFF) ? 6 : 0;
  }
  switch (b0) {
    case 0xEF:
      return (len >= 3 && b1 == 0xBB && bytes[2] == 0xBF) ? 1 : 0;
    case 0xFF:
      return b1 == 0xFE ? 4 : 0;
    case 0xFE:
      return b1 == 0xFF ? 3 : 0;
    default:
      return 0;
  }
}

std::optional<unicode_marker> unicode_marker_for(std::int64_t kind) noexcept {
  using namespace std::string_view_literals;
  switch (kind) {
    case 1:
      return unicode_marker{"\xEF\xBB\xBF"sv, marker_form::utf8};
    case 3:
      return unicode_marker{"\xFE\xFF"sv, marker_form::utf16};
    case 2:
    case 4:
      return unicode_marker{"\xFF\xFE"sv, marker_form::utf16};
    case 6:
      return unicode_marker{"\x00\x00\xFE\xFF"sv, marker_form::utf32};
    case 5:
    case 7:
      return unicode_marker{"\xFF\xFE\x00\x00"sv, marker_form::utf32};
    default:
      return std::nullopt;
  }
}

}  // namespace zul::text
