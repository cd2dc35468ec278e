// Parses declarations by splitting at the parentheses and the commas, then
// reading each piece as "<name> as <type> [= <default>]". Only the shapes the
// host language uses for plug-in methods are accepted.
#include "host/declaration.h"

#include <cctype>

namespace zul_host {
namespace {

std::string_view trim(std::string_view s) {
  while (!s.empty() && std::isspace(static_cast<unsigned char>(s.front()))) s.remove_prefix(1);
  while (!s.empty() && std::isspace(static_cast<unsigned char>(s.back()))) s.remove_suffix(1);
  return s;
}

std::string lower(std::string_view s) {
  std::string out(s);
  for (char& c : out) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
  return out;
}

bool is_name(std::string_view s) {
  if (s.empty() || std::isdigit(static_cast<unsigned char>(s.front()))) return false;
  for (char c : s) {
    if (!std::isalnum(static_cast<unsigned char>(c)) && c != '_') return false;
  }
  return true;
}

std::optional<ValueType> parse_type(std::string_view text, bool allow_array) {
  std::string t = lower(trim(text));
  std::string compact;
  for (char c : t) {
    if (!std::isspace(static_cast<unsigned char>(c))) compact += c;
  }
  if (compact == "string") return ValueType::string;
  if (compact == "integer") return ValueType::integer;
  if (compact == "double") return ValueType::double_;
  if (compact == "boolean") return ValueType::boolean;
  if (compact == "ptr") return ValueType::ptr;
  if (compact == "memoryblock") return ValueType::memory_block;
  if (compact == "string()" && allow_array) return ValueType::string_array;
  return std::nullopt;
}

// Finds the keyword "as" (any case) as a separate word; npos when absent.
std::size_t find_as(std::string_view s) {
  const std::string l = lower(s);
  for (std::size_t at = l.find("as"); at != std::string::npos; at = l.find("as", at + 1)) {
    const bool left = at > 0 && std::isspace(static_cast<unsigned char>(l[at - 1]));
    const bool right = at + 2 < l.size() && std::isspace(static_cast<unsigned char>(l[at + 2]));
    if (left && right) return at;
  }
  return std::string_view::npos;
}

std::optional<Parameter> parse_parameter(std::string_view text) {
  text = trim(text);
  const std::size_t as = find_as(text);
  if (as == std::string_view::npos) return std::nullopt;
  Parameter p;
  p.name = std::string(trim(text.substr(0, as)));
  if (!is_name(p.name)) return std::nullopt;
  std::string_view rest = text.substr(as + 2);
  if (const std::size_t eq = rest.find('='); eq != std::string_view::npos) {
    const std::string_view value = trim(rest.substr(eq + 1));
    if (value.empty()) return std::nullopt;
    p.default_value = std::string(value);
    rest = rest.substr(0, eq);
  }
  const auto type = parse_type(rest, false);
  if (!type) return std::nullopt;
  p.type = *type;
  return p;
}

}  // namespace

std::optional<Declaration> parse_declaration(std::string_view text) {
  text = trim(text);
  const std::size_t open = text.find('(');
  const std::size_t close = text.find(')', open == std::string_view::npos ? 0 : open);
  if (open == std::string_view::npos || close == std::string_view::npos) return std::nullopt;
  Declaration d;
  d.name = std::string(trim(text.substr(0, open)));
  if (!is_name(d.name)) return std::nullopt;

  const std::string_view list = trim(text.substr(open + 1, close - open - 1));
  if (!list.empty()) {
    std::size_t start = 0;
    while (true) {
      const std::size_t comma = list.find(',', start);
      auto p = parse_parameter(
          list.substr(start, comma == std::string_view::npos ? comma : comma - start));
      if (!p) return std::nullopt;
      d.params.push_back(std::move(*p));
      if (comma == std::string_view::npos) break;
      start = comma + 1;
    }
  }

  const std::string_view tail = trim(text.substr(close + 1));
  if (tail.empty()) return d;
  if (tail.size() < 3 || lower(tail.substr(0, 2)) != "as" ||
      !std::isspace(static_cast<unsigned char>(tail[2]))) {
    return std::nullopt;
  }
  const auto result = parse_type(tail.substr(2), true);
  if (!result) return std::nullopt;
  d.result = *result;
  return d;
}

const char* type_name(ValueType type) {
  switch (type) {
    case ValueType::none:
      return "none";
    case ValueType::string:
      return "string";
    case ValueType::integer:
      return "integer";
    case ValueType::double_:
      return "double";
    case ValueType::boolean:
      return "boolean";
    case ValueType::ptr:
      return "ptr";
    case ValueType::memory_block:
      return "memoryblock";
    case ValueType::string_array:
      return "string()";
  }
  return "none";
}

}  // namespace zul_host
