// Host-language declarations as the plug-in registers them, e.g.
// "StringXORZUL(data as string, XorMask as string, MaskOffset as integer = 0) as string".
// Type names are case-insensitive: string, integer, double, boolean, ptr,
// memoryblock; a result may also be string() (an array of strings). Blanks
// around commas, "as" and "=" are optional where the text stays unambiguous.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace zul_host {

enum class ValueType { none, string, integer, double_, boolean, ptr, memory_block, string_array };

struct Parameter {
  std::string name;
  ValueType type = ValueType::none;
  std::optional<std::string> default_value;  // as written, e.g. "0", "false"
  friend bool operator==(const Parameter&, const Parameter&) = default;
};

struct Declaration {
  std::string name;
  std::vector<Parameter> params;
  ValueType result = ValueType::none;  // none: no "as" after the parentheses
  friend bool operator==(const Declaration&, const Declaration&) = default;
};

// The parsed declaration, or nullopt when the text is not one: no name, no
// parentheses, a parameter without "as <type>", an unknown type, or string()
// used for a parameter.
std::optional<Declaration> parse_declaration(std::string_view text);

// "string", "integer", "double", "boolean", "ptr", "memoryblock", "string()", "none".
const char* type_name(ValueType type);

}  // namespace zul_host
