// Quoted-printable: line breaking at several line lengths, whitespace before
// line breaks, the decoder's soft breaks and malformed pairs, and round
// trips over every byte value and long lines.
#include "encodings/quoted_printable.h"

#include <gtest/gtest.h>

#include <string>

#include "common/cpu.h"
#include "tests/reference/quoted_printable_reference.h"

namespace zul::encodings {
namespace {

using namespace std::string_view_literals;

TEST(encode_quoted_printable, rules_and_line_lengths) {
  const std::string a100(100, 'a');
  struct {
    std::string_view in;
    std::int64_t line_length;
    std::string want;
    const char* why;
  } rows[] = {
      {"a=b", 72, "a=3Db", "equals sign"},
      {"Gr\xC3\xBC\xC3\x9F"
       "e",
       72, "Gr=C3=BC=C3=9Fe", "UTF-8 bytes"},
      {"\x7F", 72, "=7F", "DEL"},
      {"\t", 72, "\t", "lone tab stays literal"},
      {"a \r\nb", 72, "a=20\r\nb=\r\n", "space before a break encoded"},
      {"a\t\nb", 72, "a=09\r\nb=\r\n", "tab before a break encoded"},
      {"a b", 72, "a b", "inner space"},
      {"ab ", 72, "ab ", "trailing space literal"},
      {"x\ny", 72, "x\r\ny=\r\n", "LF"},
      {"x\r\ny", 72, "x\r\ny=\r\n", "CR LF"},
      {"x\n\ry", 72, "x\r\ny=\r\n", "LF CR"},
      {"x\r\ry", 72, "x\r\n\r\ny=\r\n", "CR CR is two breaks"},
      {"x\n", 72, "x\r\n", "empty last line: no soft break"},
      {a100, 72, std::string(70, 'a') + "=\r\n" + std::string(30, 'a'), "72"},
      {a100, 0, std::string(70, 'a') + "=\r\n" + std::string(30, 'a'), "0 selects 72"},
      {a100, 1, std::string(70, 'a') + "=\r\n" + std::string(30, 'a'), "1 selects 72"},
      {a100, -5, std::string(70, 'a') + "=\r\n" + std::string(30, 'a'), "negative selects 72"},
      {std::string_view(a100).substr(0, 20), (std::int64_t{1} << 32) + 20,
       std::string(18, 'a') + "=\r\naa", "low 32 bits: 20"},
      {"ab", 2, "=\r\na=\r\nb", "2: a break before every character"},
      {"abc", 3, "a=\r\nb=\r\nc", "3: one character per line"},
      {"\xFF\xFF", 6, "=FF=\r\n=FF", "encoded bytes are never split"},
      {"", 72, "", "empty"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(encode_quoted_printable(row.in, row.line_length), row.want);
  }
}

TEST(decode_quoted_printable, soft_breaks_and_malformed_pairs) {
  struct {
    std::string_view in, want;
    const char* why;
  } rows[] = {
      {"=41=42", "AB", "pairs"},
      {"=c3=a9", "\xC3\xA9", "lower-case digits"},
      {"abc=\r\ndef", "abcdef", "soft break CR LF"},
      {"abc=\ndef", "abcdef", "soft break LF"},
      {"abc=\n\rdef", "abcdef", "soft break LF CR"},
      {"abc=  \r\ndef", "abcdef", "whitespace before a soft break"},
      {"abc= x y\r\ndef", "abcdef", "text after = and a space is dropped"},
      {"abc= x", "abc", "... up to the end"},
      {"a\r\nb", "a\nb", "hard break becomes LF"},
      {"a\r\rb", "a\n\nb", "CR CR"},
      {"a\n\rb", "a\nb", "LF CR"},
      {"=G1x", "x", "non-digit pair"},
      {"=4G", "", "second non-digit"},
      {"=4", "", "cut-off pair"},
      {"ab=", "ab", "final ="},
      {"=", "", "= alone"},
      {"=00", "\0"sv, "zero byte"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(decode_quoted_printable(row.in), row.want);
  }
}

TEST(encode_quoted_printable, round_trips_every_byte_and_long_lines) {
  // Without line breaks in the input the decoder gives back every byte.
  std::string all;
  for (int round = 0; round < 20; ++round) {
    for (int b = 0; b < 256; ++b) {
      if (b != '\r' && b != '\n') all += static_cast<char>(b);
    }
  }
  for (const std::int64_t line_length : {72, 2, 3, 4, 5, 76, 1000}) {
    SCOPED_TRACE(line_length);
    const std::string encoded = encode_quoted_printable(all, line_length);
    EXPECT_EQ(decode_quoted_printable(encoded), all);
    // No output line is longer than the limit allows (at least one character).
    std::size_t start = 0;
    for (std::size_t end; (end = encoded.find("\r\n", start)) != std::string::npos;
         start = end + 2) {
      EXPECT_LE(end - start, static_cast<std::size_t>(std::max<std::int64_t>(line_length - 1, 4)));
    }
  }
}

// Both directions on every kernel against the byte-at-a-time references:
// every byte value (and CR LF, "= ", "=\r\n", a space before a break) at
// every position of lengths across the vector widths, at line lengths that
// wrap inside and across runs.
TEST(quoted_printable, every_kernel_matches_the_reference) {
  std::vector<std::string> specials = {"\r\n", "\n\r", "= x", "=\r\n", " \n", "\t\r", "=4", "=4g"};
  for (int b = 0; b < 256; ++b) specials.emplace_back(1, static_cast<char>(b));
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    const scan_kernels& scan = scan_for(level);
    for (std::size_t n = 1; n <= 140; n += (n < 40 ? 1 : 13)) {
      std::string in(n, 'w');
      for (std::size_t k = 3; k < n; k += 4) in[k] = ' ';
      for (std::size_t at = 0; at < n; ++at) {
        for (std::size_t k = at % 7; k < specials.size(); k += (n == 53 && at == 33 ? 1 : 47)) {
          std::string with = in;
          with.replace(at, 1, specials[k]);
          for (const std::int64_t line_length : {2, 5, 72}) {
            ASSERT_EQ(encode_quoted_printable(with, line_length, kMaxResultBytes, scan),
                      zul::reference::encode_quoted_printable_reference(with, line_length))
                << "n " << n << " at " << at << " special " << k << " line " << line_length;
          }
          ASSERT_EQ(decode_quoted_printable(with, scan),
                    zul::reference::decode_quoted_printable_reference(with));
        }
      }
    }
  }
}

}  // namespace
}  // namespace zul::encodings
