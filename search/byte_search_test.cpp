// Byte search: the range rules on a small table (the set rules are tabled
// end to end), then the table-driven versions against the plain reference
// on random data, sets and ranges.
#include "search/byte_search.h"

#include <gtest/gtest.h>

#include <random>
#include <string_view>
#include <vector>

#include "tests/reference/byte_search_reference.h"

namespace zul::search {
namespace {

bytes_view b(std::string_view s) {
  return {reinterpret_cast<const std::uint8_t*>(s.data()), s.size()};
}

TEST(find_in_ranges, unsigned_and_signed_byte_values) {
  const std::string_view c3 = "\xC3x";
  struct {
    std::string_view target;
    byte_range range;
    std::int64_t want_unsigned, want_signed;
    const char* why;
  } rows[] = {
      {"ab7c1", {48, 57}, 3, 3, "first ASCII digit"},
      {"ab7c1", {57, 48}, 0, 0, "reversed range is empty"},
      {c3, {128, 255}, 1, 0, "0xC3 is 195 unsigned, -61 signed"},
      {c3, {-128, -1}, 0, 1, "negative range only matches signed"},
      {std::string_view("a\0", 2), {0, 0}, 2, 2, "range 0..0 finds NUL"},
      {"abc", {-1000, 1000}, 1, 1, "bounds beyond a byte are not clamped"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    const byte_range ranges[] = {row.range};
    EXPECT_EQ(find_in_ranges(b(row.target), ranges), row.want_unsigned);
    EXPECT_EQ(find_in_signed_ranges_or_set(b(row.target), ranges, {}), row.want_signed);
  }
}

TEST(byte_search, table_driven_versions_match_the_reference) {
  std::mt19937 rng(12345);
  auto random_bytes = [&](std::size_t n, int lo, int hi) {
    std::uniform_int_distribution<int> d(lo, hi);
    std::vector<std::uint8_t> v(n);
    for (auto& x : v) x = static_cast<std::uint8_t>(d(rng));
    return v;
  };
  std::uniform_int_distribution<int> len(0, 300), set_len(0, 12), bound(-300, 300);
  for (int round = 0; round < 3000; ++round) {
    const auto target = random_bytes(len(rng), round % 2 ? 0 : 100, 255);
    const auto set = random_bytes(set_len(rng), 0, 255);
    std::vector<byte_range> ranges;
    for (int i = 0, n = 1 + round % 3; i < n; ++i) ranges.push_back({bound(rng), bound(rng)});
    ASSERT_EQ(find_first_of(target, set), zul::reference::find_first_of_reference(target, set));
    ASSERT_EQ(find_in_ranges(target, ranges),
              zul::reference::find_in_ranges_reference(target, ranges));
    ASSERT_EQ(find_in_signed_ranges_or_set(target, ranges, set),
              zul::reference::find_in_signed_ranges_or_set_reference(target, ranges, set));
  }
}

// One matching byte at every position of every length up to three vector
// rounds, at every misalignment: the vector skip must stop in the right
// block and never read past the end.
TEST(byte_search, vector_skip_finds_every_position) {
  std::vector<std::uint8_t> buffer(200, 'a');
  const byte_range control[] = {{0, 31}};
  const byte_range high_signed[] = {{-128, -1}};
  for (std::size_t offset = 0; offset < 16; ++offset) {
    for (std::size_t length = 0; length <= 96; ++length) {
      const bytes_view target(buffer.data() + offset, length);
      for (std::size_t at = 0; at <= length; ++at) {
        std::vector<std::uint8_t> saved(buffer);
        if (at < length) buffer[offset + at] = '\n';
        if (at + 1 < length) buffer[offset + at + 1] = 0xE9;
        const std::int64_t want = at < length ? static_cast<std::int64_t>(at) + 1 : 0;
        ASSERT_EQ(find_first_of(target, b("\r\n")), want) << offset << " " << length;
        ASSERT_EQ(find_in_ranges(target, control), want) << offset << " " << length;
        ASSERT_EQ(find_in_signed_ranges_or_set(target, high_signed, b("\n")), want);
        buffer = saved;
      }
    }
  }
}

}  // namespace
}  // namespace zul::search
