// HTML reference encoder and decoder over code points. Both reserve their
// output once for the worst case (13 bytes per character; one code point per
// character), capped at their result limit, and make one pass. The encoder
// decides every ASCII character from a 128-entry table per mode and looks
// characters from U+0080 up in the entity index; the decoder copies runs
// without "&" whole. Row-by-row references live with the tests
// (tests/reference/).
#include "encodings/html.h"

#include <array>
#include <charconv>
#include <string_view>

#include "common/markup.h"
#include "common/size_gate.h"
#include "encodings/html_entities.h"

namespace zul::encodings {
namespace {

// The longest text one character becomes: "&#4294967295;".
constexpr std::uint64_t kMaxReferenceBytes = 13;

// Each append writes nothing and says false when the output would pass
// limit bytes.
bool append_text(std::string& out, std::string_view text, std::uint64_t limit) {
  if (!make_room(out, text.size(), limit)) return false;
  out += text;
  return true;
}

bool append_numeric_reference(std::string& out, std::uint32_t cp, std::uint64_t limit) {
  char text[16] = {'&', '#'};
  char* end = std::to_chars(text + 2, text + sizeof text - 1, cp).ptr;
  *end++ = ';';
  return append_text(out, {text, static_cast<std::size_t>(end - text)}, limit);
}

bool append_named_reference(std::string& out, std::string_view name, std::uint64_t limit) {
  if (!make_room(out, name.size() + 2, limit)) return false;
  out += '&';
  out += name;
  out += ';';
  return true;
}

// What the encoder writes for each ASCII character in one mode; an empty
// text drops the character.
using ascii_actions = std::array<std::string_view, 128>;

// Each ASCII character as a one-character text, for the tables below.
constexpr std::array<char, 128> kAsciiChars = [] {
  std::array<char, 128> chars{};
  for (std::size_t c = 0; c < chars.size(); ++c) chars[c] = static_cast<char>(c);
  return chars;
}();

constexpr ascii_actions make_ascii_actions(bool escape_markup) {
  ascii_actions actions{};
  for (std::uint32_t c = 0; c < 128; ++c) {
    if (is_dropped_control(c)) continue;
    actions[c] = std::string_view(&kAsciiChars[c], 1);
  }
  if (escape_markup) {
    actions['"'] = "&quot;";
    actions['&'] = "&amp;";
    actions['\''] = "&#39;";
    actions['<'] = "&lt;";
    actions['>'] = "&gt;";
  }
  return actions;
}

constexpr ascii_actions kEscapeMarkup = make_ascii_actions(true);
constexpr ascii_actions kKeepMarkup = make_ascii_actions(false);

// The value of a reference name (the characters between "&" and ";"), or
// nothing when the name is no reference.
std::optional<std::uint32_t> reference_value(code_point_view name) {
  char ascii[8];
  bool all_ascii = true;
  for (std::size_t k = 0; k < name.size(); ++k) {
    if (name[k] > 127) all_ascii = false;
    ascii[k] = static_cast<char>(name[k]);
  }
  if (all_ascii) {
    if (auto cp = entity_code_point(std::string_view(ascii, name.size()))) return cp;
  }
  if (name[0] != '#') return std::nullopt;
  const bool hex = name.size() >= 2 && name[1] == 'x';
  std::int64_t value = 0;
  bool negative = false;
  // At most 7 digits fit in a name, so the value cannot overflow.
  for (std::size_t k = hex ? 2 : 1; k < name.size(); ++k) {
    const std::uint32_t c = name[k];
    if (c >= '0' && c <= '9') {
      value = value * (hex ? 16 : 10) + (c - '0');
    } else if (hex && c >= 'a' && c <= 'f') {
      value = value * 16 + (c - 'a' + 10);
    } else if (hex && c >= 'A' && c <= 'F') {
      value = value * 16 + (c - 'A' + 10);
    } else if (c == '-') {
      negative = true;
    } else {
      break;
    }
  }
  if (negative) value = -value;
  if (value < 1) return std::nullopt;
  return static_cast<std::uint32_t>(value);
}

}  // namespace

code_points decode_html(code_point_view text, std::uint64_t limit) {
  text = skip_byte_order_mark(text);
  const std::size_t n = text.size();
  code_points out;
  out.reserve(worst_case_reserve(n, 1, 0, limit));
  std::size_t i = 0;
  while (i < n) {
    std::size_t run = i;
    while (run < n && text[run] != '&') ++run;
    if (!make_room(out, run - i, limit)) return {};
    out.insert(out.end(), text.begin() + static_cast<std::ptrdiff_t>(i),
               text.begin() + static_cast<std::ptrdiff_t>(run));
    i = run;
    if (i == n) break;
    // text[i] is "&". Its name ends at ";" within 8 characters, or at the
    // end of the text.
    std::size_t length = 0;
    bool bounded = false;
    for (std::size_t k = 0; k <= 8; ++k) {
      const std::size_t pos = i + 1 + k;
      if (pos >= n || text[pos] == ';') {
        length = k;
        bounded = true;
        break;
      }
    }
    if (bounded && length > 0) {
      if (auto cp = reference_value(text.subspan(i + 1, length))) {
        if (!make_room(out, 1, limit)) return {};
        out.push_back(*cp);
        i += length + 2;
        continue;
      }
    }
    if (!make_room(out, 1, limit)) return {};
    out.push_back('&');
    ++i;
  }
  return out;
}

bool html_needs_escaping(code_point_view text) {
  for (const std::uint32_t c : text) {
    if (c > 127 || is_markup(c)) return true;
  }
  return false;
}

std::string encode_html(code_point_view text, std::int64_t options, std::uint64_t limit) {
  text = skip_byte_order_mark(text);
  const bool keep_markup = (options & 1) != 0;
  const ascii_actions& actions = keep_markup ? kKeepMarkup : kEscapeMarkup;
  std::string out;
  out.reserve(worst_case_reserve(text.size(), kMaxReferenceBytes, 0, limit));
  for (const std::uint32_t c : text) {
    bool fits;
    if (c < 128) {
      fits = append_text(out, actions[c], limit);
    } else if (const std::string_view name = entity_name(c, true); !name.empty()) {
      fits = append_named_reference(out, name, limit);
    } else {
      fits = append_numeric_reference(out, c, limit);
    }
    if (!fits) return {};
  }
  return out;
}

}  // namespace zul::encodings
