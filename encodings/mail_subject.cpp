// Mail subject encoding: one pass with output reserved once for the worst
// case (3 bytes per input byte + 12), capped at the result limit, where
// encoding stops. Control bytes are encoded too, since RFC 2047 allows no
// tab or control byte unencoded inside an encoded word.
#include "encodings/mail_subject.h"

#include "common/hex_digits.h"
#include "common/size_gate.h"

namespace zul::encodings {

bool subject_needs_encoding(std::string_view utf8) {
  for (const char c : utf8) {
    const auto b = static_cast<std::uint8_t>(c);
    if (b < 32 || b > 127) return true;
  }
  return false;
}

std::string encode_mail_subject(std::string_view utf8, std::uint64_t limit) {
  std::string out;
  out.reserve(worst_case_reserve(utf8.size(), 3, 12, limit));
  if (!make_room(out, 10, limit)) return {};
  out += "=?utf-8?Q?";
  for (const char c : utf8) {
    if (!make_room(out, 3, limit)) return {};
    const auto b = static_cast<std::uint8_t>(c);
    if (b == ' ') {
      out += '_';
    } else if (b < 32 || b >= 127 || b == '=' || b == '?' || b == '_') {
      out += '=';
      out += kHexDigits[b >> 4];
      out += kHexDigits[b & 15];
    } else {
      out += c;
    }
  }
  if (!make_room(out, 2, limit)) return {};
  out += "?=";
  return out;
}

}  // namespace zul::encodings
