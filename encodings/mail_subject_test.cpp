// Mail subjects: when a subject needs an encoded word, and the Q encoding of
// every byte class.
#include "encodings/mail_subject.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>

#include "common/cpu.h"
#include "tests/reference/mail_subject_reference.h"

namespace zul::encodings {
namespace {

using namespace std::string_view_literals;

TEST(subject_needs_encoding, control_and_high_bytes) {
  struct {
    std::string_view in;
    bool want;
    const char* why;
  } rows[] = {
      {"Hello", false, "printable ASCII"},
      {"a=b?c_d", false, "Q specials alone need nothing"},
      {"", false, "empty"},
      {"Caf\xC3\xA9", true, "UTF-8 bytes"},
      {"a\tb", true, "tab is a control byte"},
      {"a\0b"sv, true, "a zero byte counts, the whole length is checked"},
      {"\x7F", false, "DEL is not above 127"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(subject_needs_encoding(row.in), row.want);
  }
}

TEST(encode_mail_subject, q_encoding) {
  struct {
    std::string_view in, want;
    const char* why;
  } rows[] = {
      {"Caf\xC3\xA9?", "=?utf-8?Q?Caf=C3=A9=3F?=", "high bytes and question mark"},
      {"a b_c=d \xC3\xA9", "=?utf-8?Q?a_b=5Fc=3Dd_=C3=A9?=", "space, underscore, equals"},
      {"\x01\x1F\x7F", "=?utf-8?Q?=01=1F=7F?=", "controls and DEL"},
      {"a\0"sv, "=?utf-8?Q?a=00?=", "zero byte"},
      {"",
       "=?utf-8?Q?"
       "?=",
       "empty word"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(encode_mail_subject(row.in), row.want);
  }
}

// Every byte value at every position of lengths across the vector widths,
// on every scan level, against the byte-at-a-time reference; and the check
// of whether encoding is needed.
TEST(encode_mail_subject, every_kernel_matches_the_reference) {
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    const scan_kernels& scan = scan_for(level);
    for (std::size_t n = 1; n <= 140; n += (n < 70 ? 1 : 9)) {
      std::string in(n, 'k');
      for (std::size_t at = 0; at < n; ++at) {
        for (unsigned b = at % 11; b < 256; b += (at == n / 2 ? 1 : 41)) {
          in[at] = static_cast<char>(b);
          ASSERT_EQ(encode_mail_subject(in, kMaxResultBytes, scan),
                    zul::reference::encode_mail_subject_reference(in))
              << "n " << n << " at " << at << " byte " << b;
          ASSERT_EQ(subject_needs_encoding(in), b < 32 || b > 127);
        }
        in[at] = 'k';
      }
    }
  }
}

}  // namespace
}  // namespace zul::encodings
