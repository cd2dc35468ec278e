// Byte-order marks: detection from the first bytes and the mark of each kind.
#include "text/markers.h"

#include <gtest/gtest.h>

#include <string_view>

namespace zul::text {
namespace {

using namespace std::string_view_literals;

std::span<const std::uint8_t> b(std::string_view s) {
  return {reinterpret_cast<const std::uint8_t*>(s.data()), s.size()};
}

TEST(detect_unicode_marker, first_bytes) {
  struct {
    std::string_view in;
    std::int64_t want;
    const char* why;
  } rows[] = {
      {"\xEF\xBB\xBF"
       "A",
       1, "UTF-8"},
      {"\xEF\xBB", 0, "UTF-8 cut short"},
      {"\xFF\xFE", 4, "UTF-16 little-endian"},
      {"\xFF\xFE\0"sv, 4, "three bytes are not UTF-32"},
      {"\xFF\xFE\0\0"sv, 7, "UTF-32 little-endian wins"},
      {"\xFF\xFE\0\x01"sv, 4, "FF FE then not 00 00"},
      {"\xFE\xFF\0A"sv, 3, "UTF-16 big-endian"},
      {"\0\0\xFE\xFF"sv, 6, "UTF-32 big-endian"},
      {"\0\0\0A"sv, 0, "no mark"},
      {"\xFF", 0, "one byte"},
      {"", 0, "empty"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(detect_unicode_marker(b(row.in)), row.want);
  }
}

TEST(unicode_marker_for, every_kind) {
  struct {
    std::int64_t kind;
    std::string_view bytes;
    marker_form form;
  } rows[] = {
      {1, "\xEF\xBB\xBF", marker_form::utf8},    {2, "\xFF\xFE", marker_form::utf16},
      {3, "\xFE\xFF", marker_form::utf16},       {4, "\xFF\xFE", marker_form::utf16},
      {5, "\xFF\xFE\0\0"sv, marker_form::utf32}, {6, "\0\0\xFE\xFF"sv, marker_form::utf32},
      {7, "\xFF\xFE\0\0"sv, marker_form::utf32},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.kind);
    const auto marker = unicode_marker_for(row.kind);
    ASSERT_TRUE(marker);
    EXPECT_EQ(marker->bytes, row.bytes);
    EXPECT_EQ(marker->form, row.form);
    // Every mark is detected as the kind it is asked for (2 and 5 as 4 and 7).
    EXPECT_EQ(detect_unicode_marker(b(marker->bytes)), row.kind == 2   ? 4
                                                       : row.kind == 5 ? 7
                                                                       : row.kind);
  }
  for (const std::int64_t kind : {0, 8, -1}) EXPECT_FALSE(unicode_marker_for(kind)) << kind;
}

}  // namespace
}  // namespace zul::text
