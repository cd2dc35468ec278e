// SQL text helpers over bytes: undoing MySQL backslash escapes in string
// literals, and writing the keywords TRUE and FALSE (any case, outside
// quotes, as whole words) as 1 and 0 for databases without boolean
// literals. Neither rejects input.
#pragma once

#include <string>
#include <string_view>

#include "common/out_buffer.h"
#include "encodings/sql_kernels.h"

namespace zul::encodings {

// Decodes backslash escapes: \0 \' \" \b \n \r \t \Z \\ \% \_ (letters
// case-sensitive) give one byte; a backslash before any other byte keeps
// both bytes; a final backslash is kept. Output is at most in.size().
// Throws std::bad_alloc when memory runs out. level picks the block kernel
// (where it has one).
out_buffer decode_mysql(std::string_view in, simd::isa level = simd::best_isa());

// Rewrites "true" as "1" and "false" as "0" where the word starts after a
// separator (or at the start), is followed by a separator, at least five
// bytes follow its first letter, and no quote is open. Separators: bytes
// 0..32 and 128..255, "(", ")", "," and ";". Quotes toggle with no escape
// rule. The result ends before the first zero byte of the output. kernels
// are the candidate search to use (tests pass every level's).
std::string replace_sql_booleans(
    std::string_view utf8, const detail::sql_kernels& kernels = detail::machine_sql_kernels());

}  // namespace zul::encodings
