// Hex dumps against a model that builds the whole digit text with its
// filler run as the layout describes it, and the size checks that refuse
// oversized dumps before anything is allocated.
#include "binary/hex_dump.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>
#include <vector>

#include "common/bytes.h"
#include "tests/reference/hex_dump_reference.h"

namespace zul::binary {
namespace {

using namespace std::string_view_literals;

// The layout as a model: the whole digit text H with linelen * hexlen filler
// copies after the digits, walked while the position is inside the digits.
std::string model_dump(std::string_view in, const hex_dump_layout& l) {
  if (l.hexlen < 1 || l.linelen < 1) return {};
  const std::string_view filler = l.filler.empty() ? "0"sv : l.filler;
  std::string h;
  for (unsigned char b : in) {
    h += "0123456789ABCDEF"[b >> 4];
    h += "0123456789ABCDEF"[b & 15];
  }
  const std::size_t digits = h.size();
  for (std::int64_t k = 0; k < l.linelen * l.hexlen; ++k) h += filler;
  std::string out;
  for (std::size_t p = 0; p < digits;) {
    out += l.linestart;
    for (std::int64_t g = 1; g <= l.linelen; ++g) {
      out += h.substr(p, static_cast<std::size_t>(l.hexlen));
      p += static_cast<std::size_t>(l.hexlen);
      if (g < l.linelen) out += l.spacer;
    }
    out += l.lineend;
  }
  return out;
}

TEST(hex_dump, matches_model) {
  const std::string in(" \x00\x11\x7F\x80\xFE\xFF Hello"sv);
  for (std::size_t n = 0; n <= in.size(); n += 3) {
    for (std::int64_t hexlen = 1; hexlen <= 5; ++hexlen) {
      for (std::int64_t linelen = 1; linelen <= 4; ++linelen) {
        for (std::string_view filler : {""sv, "."sv, "abc"sv}) {
          for (std::string_view spacer : {""sv, ", "sv}) {
            const hex_dump_layout l{hexlen, linelen, "[", "]\n", spacer, filler};
            const std::string_view part(in.data(), n);
            ASSERT_EQ(hex_dump(bytes_of(part), l), model_dump(part, l))
                << n << " " << hexlen << " " << linelen << " '" << filler << "' '" << spacer << "'";
          }
        }
      }
    }
  }
}

// Dumps beyond the limit are refused by size alone, whatever the product of
// the factors, so none of these may allocate or overflow.
TEST(hex_dump, oversize_gives_empty) {
  struct {
    std::uint64_t n;
    hex_dump_layout layout;
    std::uint64_t want;
    const char* why;
  } const rows[] = {
      {1, {INT64_MAX, INT64_MAX, "", "", "", ""}, 0, "product overflows"},
      {1, {1 << 20, 1 << 20, "", "", "", ""}, 0, "one line of 2^40 characters"},
      {1, {2, 0x7FFFFFFF / 2 + 1, "", "", "", ""}, 0, "one line just over the limit"},
      {1, {1, INT64_MAX, "", "", " ", ""}, 0, "spacers overflow"},
      {0x40000000, {2, 1, "", "", "", ""}, 0x80000000, "many lines: 2^31 characters"},
      {1, {2, 0x3FFFFFFF, "", "", "", ""}, 0x7FFFFFFE, "just under the limit"},
      {3, {2, 2, "", "\n", " ", ""}, 12, "small"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    const std::uint64_t want = row.want > kMaxDumpLength ? 0 : row.want;
    EXPECT_EQ(detail::hex_dump_length(row.n, row.layout), want);
  }
  EXPECT_EQ(hex_dump(bytes_of("x"), {1 << 20, 1 << 20, "", "", "", ""}), "");
}

// Every hex kernel against the reference, on layouts that take the
// one-byte-group path and the batched one (odd line widths split bytes;
// texts longer than a 16-byte copy), at lengths around the batch size.
TEST(hex_dump, every_kernel_matches_the_reference) {
  std::vector<std::uint8_t> in(40000);
  for (std::size_t k = 0; k < in.size(); ++k) in[k] = static_cast<std::uint8_t>(k * 37 + k / 256);
  const std::string long_text(20, '-');
  const hex_dump_layout layouts[] = {
      {2, 16, "", "\n", " ", ""},   {2, 1, "", "\r\n", " ", ""},
      {2, 3, "> ", "\n", ":", "."}, {3, 5, "[", "]\n", ", ", "ab"},
      {1, 7, "", "\n", "", "xyz"},  {4, 9, long_text, long_text, long_text, ""},
      {17, 2, "", "\n", " ", "#"},  {2, 8193, "", "\n", "  ", ""},
  };
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    const auto& kernels = simd::kernels_for(detail::hex_tables(), level);
    for (const hex_dump_layout& layout : layouts) {
      for (const std::size_t n : {1u, 2u, 15u, 16u, 17u, 33u, 1000u, 8191u, 8192u, 8193u, 40000u}) {
        const std::span<const std::uint8_t> part(in.data(), n);
        ASSERT_EQ(hex_dump(part, layout, kernels), zul::reference::hex_dump_reference(part, layout))
            << "hexlen " << layout.hexlen << " linelen " << layout.linelen << " n " << n;
      }
    }
  }
}

}  // namespace
}  // namespace zul::binary
