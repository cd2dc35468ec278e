// Byte classes: the word and vector versions against the byte-at-a-time reference
// for every byte value at every position of short strings, and the filter
// on all 256 bytes. Class edges and modes are tabled end to end.
#include "text/char_class.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "tests/reference/char_class_reference.h"

namespace zul::text {
namespace {

TEST(all_bytes_in, word_version_matches_reference_for_every_byte_and_position) {
  const byte_class classes[] = {byte_class::seven_bit, byte_class::printable,
                                byte_class::non_control};
  // Up to 24 bytes the word loop decides; longer inputs go to the byte-set
  // kernels (first, middle and last vector blocks and the tail).
  std::vector<std::size_t> lengths;
  for (std::size_t n = 1; n <= 24; ++n) lengths.push_back(n);
  for (std::size_t n : {31u, 32u, 33u, 95u, 130u, 257u}) lengths.push_back(n);
  for (const std::size_t length : lengths) {
    for (std::size_t at = 0; at < length; at += (length > 40 ? 5 : 1)) {
      for (int value = 0; value < 256; ++value) {
        std::vector<std::uint8_t> s(length, 'x');
        s[at] = static_cast<std::uint8_t>(value);
        if (at + 1 < length) s[at + 1] = 0xC3;  // a high neighbour must not hide a control byte
        for (const byte_class cls : classes) {
          ASSERT_EQ(all_bytes_in(s, cls), zul::reference::all_bytes_in_reference(s, cls))
              << length << " " << at << " " << value;
        }
      }
    }
  }
}

TEST(replace_non_printable, every_byte) {
  std::vector<std::uint8_t> all(256);
  for (int c = 0; c < 256; ++c) all[c] = static_cast<std::uint8_t>(c);
  const std::string out(replace_non_printable(all, '.').view());
  ASSERT_EQ(out.size(), 256u);
  for (int c = 0; c < 256; ++c)
    EXPECT_EQ(out[c], c >= 0x20 && c <= 0x7F ? static_cast<char>(c) : '.') << c;
}

}  // namespace
}  // namespace zul::text
