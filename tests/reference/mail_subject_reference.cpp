// Written for clarity, not speed.
#include "tests/reference/mail_subject_reference.h"

#include "common/hex_digits.h"

namespace zul::reference {

std::string encode_mail_subject_reference(std::string_view utf8, std::uint64_t limit) {
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

}  // namespace zul::reference
