// Conversions among UTF-8, UTF-16 and UTF-32 (host byte order), done by the
// stand-in host itself on every platform. They refuse what the system
// converters refuse (surrogate code points, values above U+10FFFF, overlong
// or cut-short UTF-8, a lone UTF-16 surrogate, a length that is not a whole
// number of units) and keep a byte-order mark as the character U+FEFF. They
// run in one pass into a buffer sized once, so that timing a function end to
// end measures the plug-in rather than the system's converter, which the
// functions that build UTF-32 or read UTF-16 would otherwise wait on.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace zul_host {

// UTF-8, UTF-16 or UTF-32.
bool is_unicode_form(std::uint32_t encoding);

// bytes re-encoded from one Unicode form to another (both is_unicode_form);
// nullopt when bytes are not well formed in `from`.
std::optional<std::string> convert_unicode(std::string_view bytes, std::uint32_t from,
                                           std::uint32_t to);

}  // namespace zul_host
