// One character at a time and one table row at a time, written for clarity,
// not speed.
#include "tests/reference/html_reference.h"

#include "common/markup.h"
#include "encodings/html_entities_tables.h"

namespace zul::reference {
namespace {

// The value of a name between "&" and ";": a table name, or "#" + decimal
// digits / "#x" + hex digits ("-" negates, the first other character ends
// the digits) when the value is 1 or more.
std::optional<std::uint32_t> reference_value(encodings::code_point_view name) {
  std::string ascii;
  bool all_ascii = true;
  for (const std::uint32_t c : name) {
    if (c > 127) all_ascii = false;
    ascii += static_cast<char>(c);
  }
  if (all_ascii) {
    if (auto cp = entity_code_point_reference(ascii)) return cp;
  }
  if (name[0] != '#') return std::nullopt;
  const bool hex = name.size() >= 2 && name[1] == 'x';
  const std::int64_t base = hex ? 16 : 10;
  std::int64_t value = 0;
  bool negative = false;
  for (std::size_t k = hex ? 2 : 1; k < name.size(); ++k) {
    const std::uint32_t c = name[k];
    std::int64_t digit = -1;
    if (c >= '0' && c <= '9') digit = c - '0';
    if (hex && c >= 'a' && c <= 'f') digit = c - 'a' + 10;
    if (hex && c >= 'A' && c <= 'F') digit = c - 'A' + 10;
    if (digit >= 0) {
      value = value * base + digit;
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

std::string_view entity_name_reference(std::uint32_t cp, bool from_nbsp) {
  for (const encodings::entity& row : encodings::kEntities) {
    if (from_nbsp && row.code_point < 0xA0) continue;
    if (row.code_point == cp) return row.name;
  }
  return {};
}

std::optional<std::uint32_t> entity_code_point_reference(std::string_view name) {
  for (const encodings::entity& row : encodings::kEntities) {
    if (row.name == name) return row.code_point;
  }
  return std::nullopt;
}

std::string encode_html_reference(encodings::code_point_view text, std::int64_t options) {
  text = skip_byte_order_mark(text);
  const bool keep_markup = (options & 1) != 0;
  std::string out;
  for (const std::uint32_t c : text) {
    if (!keep_markup && c == '\'') {
      out += "&#39;";
    } else if (const std::string_view name = entity_name_reference(c, keep_markup); !name.empty()) {
      out += '&';
      out += name;
      out += ';';
    } else if (c >= 128) {
      out += "&#" + std::to_string(c) + ";";
    } else if (!is_dropped_control(c)) {
      out += static_cast<char>(c);
    }
  }
  return out;
}

encodings::code_points decode_html_reference(encodings::code_point_view text) {
  text = skip_byte_order_mark(text);
  const std::size_t n = text.size();
  encodings::code_points out;
  std::size_t i = 0;
  while (i < n) {
    if (text[i] != '&') {
      out.push_back(text[i++]);
      continue;
    }
    // The name runs to the next ";" within 8 characters, or to the end.
    std::size_t length = 0;
    bool bounded = false;
    for (std::size_t k = 0; k <= 8 && !bounded; ++k) {
      const std::size_t pos = i + 1 + k;
      if (pos >= n || text[pos] == ';') {
        length = k;
        bounded = true;
      }
    }
    if (bounded && length > 0) {
      if (auto cp = reference_value(text.subspan(i + 1, length))) {
        out.push_back(*cp);
        i += length + 2;
        continue;
      }
    }
    out.push_back('&');
    ++i;
  }
  return out;
}

}  // namespace zul::reference
