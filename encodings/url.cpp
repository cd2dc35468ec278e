// Percent-encoding: one pass over the input into a buffer sized once for the
// worst case (3 bytes per input byte). The encoder reads one of three
// immutable 256-entry tables chosen by the options (options 0 and 3 share
// one), so concurrent calls with different options never interfere. Runs of
// bytes that need no change are copied whole in both directions.
#include "encodings/url.h"

#include <array>
#include <cstring>

#include "common/hex_digits.h"
#include "common/size_gate.h"

namespace zul::encodings {
namespace {

constexpr bool is_unreserved(unsigned b) {
  return (b >= 'A' && b <= 'Z') || (b >= 'a' && b <= 'z') || (b >= '0' && b <= '9') || b == '!' ||
         b == '*' || b == '-' || b == '.' || b == '@' || b == '_';
}

bool plus_as_space(std::int64_t options) { return (options & 1) != 0; }

// One replacement: its length (1 or 3) and up to 4 bytes written at once.
struct escape {
  std::uint8_t length;
  char text[4];
};
using escape_table = std::array<escape, 256>;

constexpr escape_table make_table(bool space_plus, bool plus_escaped) {
  escape_table table{};
  for (unsigned b = 0; b < 256; ++b) {
    if (is_unreserved(b) || (b == '+' && !plus_escaped) || (b == ' ' && space_plus)) {
      table[b] = {1, {static_cast<char>(b == ' ' ? '+' : b), 0, 0, 0}};
    } else {
      table[b] = {3, {'%', kHexDigits[b >> 4], kHexDigits[b & 15], 0}};
    }
  }
  return table;
}

constexpr escape_table kPlain = make_table(false, false);       // options 0, 3
constexpr escape_table kSpacePlus = make_table(true, true);     // options 1
constexpr escape_table kPlusEscaped = make_table(false, true);  // options 2

const escape_table& table_for(std::int64_t options) {
  switch (options & 3) {
    case 1:
      return kSpacePlus;
    case 2:
      return kPlusEscaped;
    default:
      return kPlain;
  }
}

// Bytes that the encoder copies unchanged whatever the options.
constexpr std::array<bool, 256> kKeep = [] {
  std::array<bool, 256> keep{};
  for (unsigned b = 0; b < 256; ++b) keep[b] = is_unreserved(b);
  return keep;
}();

// The exact encoded size of in, counted only when its worst case passes the
// limit; 0 (with the output's size unknown) once the count passes it.
std::uint64_t encoded_size(const escape_table& table, std::string_view in, std::uint64_t limit) {
  std::uint64_t total = 0;
  for (const char c : in) {
    total += table[static_cast<std::uint8_t>(c)].length;
    if (total > limit) return 0;
  }
  return total;
}

}  // namespace

std::string encode_url(std::string_view in, std::int64_t options, std::uint64_t limit) {
  const escape_table& table = table_for(options);
  const auto* p = reinterpret_cast<const std::uint8_t*>(in.data());
  const std::size_t n = in.size();
  // 3 bytes per input byte. Only when that worst case passes the limit is the
  // exact size counted first; an output past the limit is never allocated.
  std::uint64_t room = result_size(limit).add_times(3, n).bytes();
  if (room == 0 && n != 0) {
    if (!fits_result(n, limit)) return {};  // every byte gives at least one
    room = encoded_size(table, in, limit);
    if (room == 0) return {};
  }
  // Slack so each entry can be stored as 4 bytes.
  std::string out(room + 10, '\0');
  char* o = out.data();
  std::size_t i = 0;
  while (i < n) {
    // Copy a run of bytes that stay as they are in one go.
    std::size_t run = i;
    while (run < n && kKeep[p[run]]) ++run;
    if (run > i) {
      std::memcpy(o, p + i, run - i);
      o += run - i;
      i = run;
      if (i == n) break;
    }
    const escape& e = table[p[i++]];
    std::memcpy(o, e.text, 4);
    o += e.length;
  }
  out.resize(static_cast<std::size_t>(o - out.data()));
  return out;
}

std::string decode_url(std::string_view in, std::int64_t options) {
  const std::size_t n = in.size();
  std::string out(n, '\0');
  char* o = out.data();
  const char* p = in.data();
  const bool plus = plus_as_space(options);
  std::size_t i = 0;
  while (i < n) {
    // Copy everything up to the next "%" (or "+" when it means a space).
    std::size_t run = i;
    while (run < n && p[run] != '%' && !(plus && p[run] == '+')) ++run;
    std::memcpy(o, p + i, run - i);
    o += run - i;
    i = run;
    if (i == n) break;
    if (p[i] == '+') {
      *o++ = ' ';
      ++i;
      continue;
    }
    const unsigned high = i + 1 < n ? hex_value(p[i + 1]) : 0;
    const unsigned low = i + 2 < n ? hex_value(p[i + 2]) : 0;
    *o++ = static_cast<char>((high << 4) | low);
    i += 3;
  }
  out.resize(static_cast<std::size_t>(o - out.data()));
  return out;
}

}  // namespace zul::encodings
