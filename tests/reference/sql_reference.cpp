// Two quote flags and the position in the current word, byte by byte; a
// word byte is anything but a separator, quotes included.
#include "tests/reference/sql_reference.h"

#include <array>
#include <cstdint>

namespace zul::reference {
namespace {

constexpr std::array<bool, 256> kSeparators = [] {
  std::array<bool, 256> table{};
  for (unsigned b = 0; b < 256; ++b) table[b] = b <= 32 || b >= 128;
  table['('] = table[')'] = table[','] = table[';'] = true;
  return table;
}();

bool is_separator(char c) { return kSeparators[static_cast<std::uint8_t>(c)]; }

// True when the bytes at p spell word (lower case) in any mixture of case.
bool spells(const char* p, std::string_view word) {
  for (std::size_t k = 0; k < word.size(); ++k) {
    if ((p[k] | 0x20) != word[k]) return false;
  }
  return true;
}

}  // namespace

std::string decode_mysql_reference(std::string_view in) {
  static constexpr std::string_view kLetters("0'\"bnrtZ\\%_", 11),
      kBytes("\0'\"\b\n\r\t\x1A\\%_", 11);
  std::string out;
  for (std::size_t i = 0; i < in.size(); ++i) {
    const std::size_t k =
        i + 1 < in.size() && in[i] == '\\' ? kLetters.find(in[i + 1]) : kLetters.npos;
    if (k == kLetters.npos) {
      out += in[i];
      if (in[i] == '\\' && i + 1 < in.size()) out += in[++i];  // not an escape: both kept
    } else {
      out += kBytes[k];
      ++i;
    }
  }
  return out;
}

std::string replace_sql_booleans_reference(std::string_view utf8) {
  const std::size_t n = utf8.size();
  std::string out;
  out.reserve(n + 10);
  bool in_single = false;
  bool in_double = false;
  std::size_t word_position = 0;
  for (std::size_t i = 0; i < n; ++i) {
    const char c = utf8[i];
    if (c == '\'' && !in_double) in_single = !in_single;
    if (c == '"' && !in_single) in_double = !in_double;
    word_position = is_separator(c) ? 0 : word_position + 1;
    if (!in_single && !in_double && word_position == 1 && i + 5 < n) {
      const char* p = utf8.data() + i;
      if (spells(p, "false") && is_separator(p[5])) {
        out += '0';
        i += 4;
        continue;
      }
      if (spells(p, "true") && is_separator(p[4])) {
        out += '1';
        i += 3;
        continue;
      }
    }
    out += c;
  }
  if (const std::size_t zero = out.find('\0'); zero != std::string::npos) out.resize(zero);
  return out;
}

}  // namespace zul::reference
