// The stand-in host's platform layer gives the same answers on every
// platform the tests run on (iconv on Linux, the Win32 code pages under
// Wine): the upper halves of the 8-bit encodings code point by code point,
// the strict refusals, and loading errors that name the file.
#include <gtest/gtest.h>

#include <stdexcept>
#include <string>

#include "host/host.h"
#include "host/text_convert.h"

namespace {

using namespace zul_host;
using namespace text_encoding;

std::string utf32(char32_t c) {
  std::string out;
  for (int k = 0; k < 4; ++k) out += static_cast<char>((c >> (8 * k)) & 0xFF);
  return out;
}

// Bytes 0x80 to 0xFF of Mac OS Roman (0xDB is the euro sign, 0xF0 the
// logo in the private use area).
constexpr char32_t kMacRomanHigh[128] = {
    0x00C4, 0x00C5, 0x00C7, 0x00C9, 0x00D1, 0x00D6, 0x00DC, 0x00E1, 0x00E0, 0x00E2, 0x00E4, 0x00E3,
    0x00E5, 0x00E7, 0x00E9, 0x00E8, 0x00EA, 0x00EB, 0x00ED, 0x00EC, 0x00EE, 0x00EF, 0x00F1, 0x00F3,
    0x00F2, 0x00F4, 0x00F6, 0x00F5, 0x00FA, 0x00F9, 0x00FB, 0x00FC, 0x2020, 0x00B0, 0x00A2, 0x00A3,
    0x00A7, 0x2022, 0x00B6, 0x00DF, 0x00AE, 0x00A9, 0x2122, 0x00B4, 0x00A8, 0x2260, 0x00C6, 0x00D8,
    0x221E, 0x00B1, 0x2264, 0x2265, 0x00A5, 0x00B5, 0x2202, 0x2211, 0x220F, 0x03C0, 0x222B, 0x00AA,
    0x00BA, 0x03A9, 0x00E6, 0x00F8, 0x00BF, 0x00A1, 0x00AC, 0x221A, 0x0192, 0x2248, 0x0394, 0x00AB,
    0x00BB, 0x2026, 0x00A0, 0x00C0, 0x00C3, 0x00D5, 0x0152, 0x0153, 0x2013, 0x2014, 0x201C, 0x201D,
    0x2018, 0x2019, 0x00F7, 0x25CA, 0x00FF, 0x0178, 0x2044, 0x20AC, 0x2039, 0x203A, 0xFB01, 0xFB02,
    0x2021, 0x00B7, 0x201A, 0x201E, 0x2030, 0x00C2, 0x00CA, 0x00C1, 0x00CB, 0x00C8, 0x00CD, 0x00CE,
    0x00CF, 0x00CC, 0x00D3, 0x00D4, 0xE01E, 0x00D2, 0x00DA, 0x00DB, 0x00D9, 0x0131, 0x02C6, 0x02DC,
    0x00AF, 0x02D8, 0x02D9, 0x02DA, 0x00B8, 0x02DD, 0x02DB, 0x02C7};

// Bytes 0x80 to 0x9F of Windows-1252; 0 marks the five undefined ones. From
// 0xA0 on it is ISO Latin 1.
constexpr char32_t kWindows1252C1[32] = {
    0x20AC, 0,      0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021, 0x02C6, 0x2030, 0x0160,
    0x2039, 0x0152, 0,      0x017D, 0,      0,      0x2018, 0x2019, 0x201C, 0x201D, 0x2022,
    0x2013, 0x2014, 0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0,      0x017E, 0x0178};

TEST(platform_convert, upper_halves_of_the_8_bit_encodings) {
  for (int b = 0x80; b < 0x100; ++b) {
    SCOPED_TRACE(b);
    const std::string byte(1, static_cast<char>(b));
    const char32_t roman = kMacRomanHigh[b - 0x80];
    EXPECT_EQ(convert_text(byte, kMacRoman, kUTF32), utf32(roman));
    EXPECT_EQ(convert_text(utf32(roman), kUTF32, kMacRoman), byte);
    const char32_t cp1252 = b < 0xA0 ? kWindows1252C1[b - 0x80] : static_cast<char32_t>(b);
    if (cp1252 == 0) {
      EXPECT_EQ(convert_text(byte, kWindowsLatin1, kUTF32), std::nullopt);
      EXPECT_EQ(convert_text(utf32(static_cast<char32_t>(b)), kUTF32, kWindowsLatin1),
                std::nullopt);
    } else {
      EXPECT_EQ(convert_text(byte, kWindowsLatin1, kUTF32), utf32(cp1252));
      EXPECT_EQ(convert_text(utf32(cp1252), kUTF32, kWindowsLatin1), byte);
    }
    EXPECT_EQ(convert_text(byte, kLatin1, kUTF32), utf32(static_cast<char32_t>(b)));
    EXPECT_EQ(convert_text(byte, kASCII, kUTF8), std::nullopt);
  }
}

TEST(platform_convert, refusals) {
  struct {
    std::string bytes;
    std::uint32_t from, to;
    const char* why;
  } rows[] = {
      {"\xC3\xA9", kUTF8, kASCII, "U+00E9 is not ASCII"},
      {"\xE2\x82\xAC", kUTF8, kLatin1, "the euro sign is not Latin 1"},
      {"\xE2\x82\xAC", kUTF8, kUnknown, "bytes without an encoding are Latin 1"},
      {"\xE2\x89\xA0", kUTF8, kWindowsLatin1, "U+2260 has no Windows-1252 byte"},
      {"\xE2\x82\xAD", kUTF8, kMacRoman, "U+20AD has no Mac OS Roman byte"},
      {"\xC3\x28", kUTF8, kUTF16, "broken UTF-8"},
      {"\xED\xA0\x80", kUTF8, kUTF16, "UTF-8 of a surrogate"},
      {"\xC0\xAF", kUTF8, kUTF16, "overlong UTF-8"},
      {std::string("\x00\xD8\x00\x00", 4), kUTF32, kUTF8, "UTF-32 surrogate"},
      {std::string("\x00\x00\x11\x00", 4), kUTF32, kUTF8, "beyond U+10FFFF"},
      {std::string("\x3D\xD8", 2), kUTF16, kUTF32, "high surrogate at the end"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(convert_text(row.bytes, row.from, row.to), std::nullopt);
  }
}

TEST(platform_library, load_failure_names_the_file) {
  Host host;
  const std::string missing = "no-such-folder/no-such-plugin.bin";
  try {
    host.load(missing);
    FAIL() << "loaded a missing file";
  } catch (const std::runtime_error& e) {
    EXPECT_NE(std::string(e.what()).find(missing), std::string::npos) << e.what();
  }
}

}  // namespace
