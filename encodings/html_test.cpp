// HTML references: the encoder's two modes and the decoder's reference
// rules on tables of cases, every code point up to U+2800 through the
// indexed and the scanning versions, and round trips.
#include "encodings/html.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>

#include "common/cpu.h"
#include "encodings/html_entities.h"
#include "encodings/xml.h"
#include "tests/reference/html_reference.h"
#include "tests/reference/xml_reference.h"

namespace zul::encodings {
namespace {

code_points cps(std::u32string_view text) { return {text.begin(), text.end()}; }

// Markup in both modes, a Latin-1 row and an astral character are not
// repeated here: the kernel sweep below checks them against the reference,
// and encodings_e2e_test tables them end to end.
TEST(encode_html, both_modes) {
  struct {
    std::u32string_view in;
    std::string_view want0, want1;
    const char* why;
  } rows[] = {
      {U"\"", "&quot;", "\"", "double quote"},
      {U"\u0100", "&#256;", "&#256;", "no row, BMP"},
      {U"\u03D1\u2283\u00A0\u00FF", "&thetasym;&sup;&nbsp;&yuml;", "&thetasym;&sup;&nbsp;&yuml;",
       "rows at both ends of Latin-1 and beyond"},
      {U"a\u0001<", "a&lt;", "a<", "control dropped"},
      {U"a\t\n\r\u007F", "a\t\n\r\x7F", "a\t\n\r\x7F", "tab, LF, CR and DEL kept"},
      {std::u32string_view(U"a\0b", 3), "ab", "ab", "zero dropped"},
      {U"\uFEFFx", "x", "x", "leading BOM dropped"},
      {U"\uFFFE\uFEFF", "&#65279;", "&#65279;", "only the first BOM dropped"},
      {U"\uFEFF", "", "", "BOM only"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    const code_points in = cps(row.in);
    EXPECT_EQ(encode_html(in, 0), row.want0);
    EXPECT_EQ(encode_html(in, 1), row.want1);
    EXPECT_EQ(encode_html(in, 2), row.want0);
    EXPECT_EQ(zul::reference::encode_html_reference(in, 0), row.want0);
    EXPECT_EQ(zul::reference::encode_html_reference(in, 1), row.want1);
  }
}

TEST(decode_html, reference_rules) {
  struct {
    std::u32string_view in, want;
    const char* why;
  } rows[] = {
      {U"&lt;&gt;&amp;&quot;&apos;", U"<>&\"'", "markup names"},
      {U"&sup;&or;&sup2;", U"\u2283\u2228\u00B2", "short names"},
      {U"&#65;&#x41;&#x0041;", U"AAA", "numeric"},
      {U"&#x4a;&#x4A;", U"JJ", "hex either case"},
      {U"&#X41;", U"&#X41;", "upper-case X is not hex"},
      {U"&#0;&#-65;&#;", U"&#0;&#-65;&#;", "values below 1"},
      {U"&#6-5;", U"&#6-5;", "minus anywhere negates"},
      {U"&#65abc;", U"A", "text after the digits ignored"},
      {U"&AMP;&a;", U"&AMP;&a;", "unknown names"},
      {U"&thetasym;", U"\u03D1", "8-character name"},
      {U"&#0000065;", U"A", "8-character numeric name"},
      {U"&#00000065;", U"&#00000065;", "9 characters is too long"},
      {U"x &amp", U"x &", "no ; at the end of the text"},
      {U"&amp x", U"&amp x", "no ; in the middle"},
      {U"&&amp;", U"&&", "& before a reference"},
      {U"a&", U"a&", "lone & at the end"},
      {U"&;", U"&;", "empty name"},
      {U"&#x1F600;", U"\U0001F600", "astral code point"},
      {U"&\u00E9;", U"&\u00E9;", "non-ASCII name"},
      {U"&#65\u00E9;", U"A", "non-ASCII after the digits"},
      {U"\uFEFF&lt;", U"<", "leading BOM dropped"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    const code_points in = cps(row.in);
    EXPECT_EQ(decode_html(in), cps(row.want));
    EXPECT_EQ(zul::reference::decode_html_reference(in), cps(row.want));
  }
}

TEST(entity_index, agrees_with_the_table_scan) {
  for (std::uint32_t cp = 0; cp < 0x2800; ++cp) {
    SCOPED_TRACE(cp);
    for (const bool from_nbsp : {false, true}) {
      const std::string_view name = entity_name(cp, from_nbsp);
      ASSERT_EQ(name, zul::reference::entity_name_reference(cp, from_nbsp));
      if (!name.empty()) {
        ASSERT_EQ(entity_code_point(name), cp);
      }
    }
  }
  EXPECT_EQ(entity_code_point("thetasym"), 0x3D1u);
  EXPECT_EQ(entity_code_point("Thetasym"), std::nullopt);
  EXPECT_EQ(entity_code_point(""), std::nullopt);
  EXPECT_EQ(entity_code_point("zzzzzzzz"), std::nullopt);
}

TEST(encode_html, round_trip_through_the_decoder) {
  // Every character from U+0020 up (except the byte-order marks) comes back.
  std::mt19937 rng(11);
  code_points in;
  for (std::uint32_t cp = 32; cp < 0x3000; ++cp) in.push_back(cp);
  for (int k = 0; k < 2000; ++k) in.push_back(0x10000 + rng() % 0x100000);
  for (const std::int64_t options : {0, 1}) {
    SCOPED_TRACE(options);
    const std::string encoded(encode_html(in, options).view());
    EXPECT_EQ(encoded, zul::reference::encode_html_reference(in, options));
    const code_points encoded_cps(encoded.begin(), encoded.end());
    const code_points decoded = decode_html(encoded_cps);
    EXPECT_EQ(decoded, zul::reference::decode_html_reference(encoded_cps));
    if (options == 0) {
      EXPECT_EQ(decoded, in);
    }
  }
}

// The vector paths of the HTML and XML encoders and the HTML decoder against
// their references on every kernel: each interesting character (markup,
// controls, every code point up to U+00FF, saturating values above) at every
// position of text lengths across the vector widths, and runs of them.
TEST(markup_codecs, every_kernel_matches_the_references) {
  std::vector<std::uint32_t> specials = {0x100, 0x3D1, 0xFEFF, 0x10000, 0x7FFFFFFF, 0xFFFFFFFF};
  for (std::uint32_t c = 0; c < 256; c += 1) specials.push_back(c);
  const std::u32string_view pieces[] = {U"&amp;", U"&#x41;", U"&lt", U"&", U"<&>\"'\u00E9\u0001"};
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    const scan_kernels& scan = scan_for(level);
    const auto check = [&](const code_points& in) {
      const bool ascii =
          std::all_of(in.begin(), in.end(), [](std::uint32_t c) { return c < 0x80; });
      const std::vector<std::uint8_t> bytes(in.begin(), in.end());
      for (const std::int64_t options : {0, 1}) {
        ASSERT_EQ(encode_html(in, options, kMaxResultBytes, scan),
                  zul::reference::encode_html_reference(in, options));
        if (ascii) {
          ASSERT_EQ(encode_ascii_html(bytes, options, kMaxResultBytes, scan),
                    zul::reference::encode_html_reference(in, options));
        }
        ASSERT_EQ(encode_xml(in, options, kMaxResultCodePoints, scan),
                  zul::reference::encode_xml_reference(in, options));
      }
      ASSERT_EQ(decode_html(in, kMaxResultCodePoints, scan),
                zul::reference::decode_html_reference(in));
    };
    for (std::size_t n = 1; n <= 140; n += (n < 40 ? 1 : 17)) {
      code_points in(n, 'x');
      for (std::size_t at = 0; at < n; ++at) {
        for (std::size_t k = at % 7; k < specials.size(); k += (n == 57 && at == 35 ? 1 : 97)) {
          in[at] = specials[k];
          check(in);
        }
        // References and runs of markup inserted at every fifth position.
        for (const std::u32string_view piece : pieces) {
          if (at % 5 != 0) continue;
          code_points with = in;
          with.insert(with.begin() + static_cast<std::ptrdiff_t>(at), piece.begin(), piece.end());
          check(with);
        }
        in[at] = 'x';
      }
    }
    code_points dense;  // every character needs work: the one-by-one path
    for (int k = 0; k < 600; ++k)
      dense.push_back(specials[static_cast<std::size_t>(k) % specials.size()]);
    check(dense);
  }
}

}  // namespace
}  // namespace zul::encodings
