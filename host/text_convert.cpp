// The checks and fast paths shared by every platform: unknown encodings are
// refused, a conversion to the same encoding is a copy, and text that is all
// ASCII between two ASCII-compatible encodings is copied without the
// system's converter (the common case in tests and benchmarks). Mac OS Roman
// goes through the host's own table (host/mac_roman.h), by way of UTF-32;
// UTF-8, UTF-16 and UTF-32 among themselves through the host's own code
// (host/unicode_forms.h); everything else goes to the platform layer
// (iconv, or the Win32 code pages).
#include "host/text_convert.h"

#include <cstdio>
#include <utility>

#include "host/mac_roman.h"
#include "host/platform.h"
#include "host/unicode_forms.h"
#include "plugin/host_types.h"

namespace zul_host {
namespace {

using namespace text_encoding;

bool ascii_compatible(std::uint32_t encoding) { return encoding != kUTF16 && encoding != kUTF32; }

bool all_ascii(std::string_view bytes) {
  for (unsigned char c : bytes) {
    if (c >= 0x80) return false;
  }
  return true;
}

}  // namespace

bool known_encoding(std::uint32_t encoding) {
  switch (encoding) {
    case kMacRoman:
    case kUTF16:
    case kLatin1:
    case kWindowsLatin1:
    case kASCII:
    case kUTF8:
    case kUTF32:
    case kUnknown:
      return true;
    default:
      return false;
  }
}

std::optional<std::string> convert_text(std::string_view bytes, std::uint32_t from,
                                        std::uint32_t to) {
  if (!known_encoding(from) || !known_encoding(to)) return std::nullopt;
  if (from == to) return std::string(bytes);
  if (ascii_compatible(from) && ascii_compatible(to) && all_ascii(bytes)) return std::string(bytes);
  if (is_unicode_form(from) && is_unicode_form(to)) return convert_unicode(bytes, from, to);
  if (from == kMacRoman) {
    std::string wide = mac_roman_to_utf32(bytes);
    if (to == kUTF32) return wide;
    return is_unicode_form(to) ? convert_unicode(wide, kUTF32, to)
                               : platform::convert(wide, kUTF32, to);
  }
  if (to == kMacRoman) {
    const std::optional<std::string> wide = from == kUTF32 ? std::optional<std::string>(bytes)
                                            : is_unicode_form(from)
                                                ? convert_unicode(bytes, from, kUTF32)
                                                : platform::convert(bytes, from, kUTF32);
    return wide ? utf32_to_mac_roman(*wide) : std::nullopt;
  }
  return platform::convert(bytes, from, to);
}

std::string encoding_label(std::uint32_t encoding) {
  switch (encoding) {
    case kMacRoman:
      return "Mac OS Roman";
    case kUTF16:
      return "UTF-16";
    case kLatin1:
      return "ISO Latin 1";
    case kWindowsLatin1:
      return "Windows Latin 1";
    case kASCII:
      return "ASCII";
    case kUTF8:
      return "UTF-8";
    case kUTF32:
      return "UTF-32";
    case kUnknown:
      return "unknown (0xFFFF)";
    default: {
      char text[32];
      std::snprintf(text, sizeof text, "encoding 0x%X", static_cast<unsigned>(encoding));
      return text;
    }
  }
}

}  // namespace zul_host
