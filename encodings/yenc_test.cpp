// yEnc: the worked byte values (escapes, a final "=", line breaks as
// data), and the run-based decoder against the byte-at-a-time one across
// lengths and escape densities.
#include "encodings/yenc.h"

#include <gtest/gtest.h>

#include <random>
#include <string>

#include "tests/reference/yenc_reference.h"

namespace zul::encodings {
namespace {

using namespace std::string_view_literals;

// The worked values not already tabled end to end (minus 42, "=@", "=}"
// and a final "=" are, in encodings_e2e_test).
TEST(decode_yenc, byte_values) {
  struct {
    std::string_view in, want;
    const char* why;
  } rows[] = {
      {"=J", "\xE0", "escaped 74"},   {"\0"sv, "\xD6", "zero byte"},
      {"\xFF", "\xD5", "byte 255"},   {"\r\n", "\xE3\xE0", "line breaks are data"},
      {"==", "\xD3", "an escaped ="}, {"", "", "empty"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(decode_yenc(row.in), row.want);
    EXPECT_EQ(zul::reference::decode_yenc_reference(row.in), row.want);
  }
}

TEST(decode_yenc, runs_match_the_scalar_decoder) {
  std::mt19937 rng(5);
  for (std::size_t size = 0; size < 300; size += 7) {
    for (const int escape_every : {2, 5, 50, 1000}) {
      std::string in(size, '\0');
      for (char& c : in) c = rng() % escape_every == 0 ? '=' : static_cast<char>(rng());
      ASSERT_EQ(decode_yenc(in), zul::reference::decode_yenc_reference(in))
          << size << " / " << escape_every;
    }
  }
}

}  // namespace
}  // namespace zul::encodings
