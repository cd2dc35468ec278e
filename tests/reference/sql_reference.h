// The TRUE / FALSE rewrite one byte at a time, following its rules
// directly: the reference for replace_sql_booleans (encodings/sql.h).
#pragma once

#include <string>
#include <string_view>

namespace zul::reference {

// MySQL backslash escapes undone one byte at a time.
std::string decode_mysql_reference(std::string_view in);

std::string replace_sql_booleans_reference(std::string_view utf8);

}  // namespace zul::reference
