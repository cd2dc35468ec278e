// Mail subjects: when a subject needs an encoded word, and the Q encoding of
// every byte class.
#include "encodings/mail_subject.h"

#include <gtest/gtest.h>

#include <string_view>

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

}  // namespace
}  // namespace zul::encodings
