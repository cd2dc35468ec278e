// One byte at a time, written for clarity, not speed. The unreserved set and
// the option bits are spelled out here again on purpose: the reference must
// not share the tables it checks.
#include "tests/reference/url_reference.h"

#include "common/hex_digits.h"

namespace zul::reference {
namespace {

bool is_unreserved(unsigned char b) {
  return (b >= 'A' && b <= 'Z') || (b >= 'a' && b <= 'z') || (b >= '0' && b <= '9') || b == '!' ||
         b == '*' || b == '-' || b == '.' || b == '@' || b == '_';
}

}  // namespace

std::string encode_url_reference(std::string_view in, std::int64_t options) {
  const bool space_as_plus = (options & 3) == 1;
  const bool escape_plus = (options & 3) == 1 || (options & 3) == 2;
  std::string out;
  for (const char c : in) {
    const auto b = static_cast<unsigned char>(c);
    if (b == ' ' && space_as_plus) {
      out += '+';
    } else if (is_unreserved(b) || (b == '+' && !escape_plus)) {
      out += c;
    } else {
      out += '%';
      out += kHexDigits[b / 16];
      out += kHexDigits[b % 16];
    }
  }
  return out;
}

std::string decode_url_reference(std::string_view in, std::int64_t options) {
  const bool plus_as_space = (options & 1) != 0;
  std::string out;
  for (std::size_t i = 0; i < in.size();) {
    if (in[i] == '%') {
      const unsigned high = i + 1 < in.size() ? hex_value(in[i + 1]) : 0;
      const unsigned low = i + 2 < in.size() ? hex_value(in[i + 2]) : 0;
      out += static_cast<char>((high * 16 + low) & 0xFF);
      i += 3;
    } else if (plus_as_space && in[i] == '+') {
      out += ' ';
      ++i;
    } else {
      out += in[i++];
    }
  }
  return out;
}

}  // namespace zul::reference
