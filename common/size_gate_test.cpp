// The size gate's arithmetic at the edges: sums and products just below, at
// and past the limit, 64-bit overflow, and make_room's growth never passing
// the limit.
#include "common/size_gate.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <limits>
#include <string>
#include <vector>

namespace zul {
namespace {

constexpr std::uint64_t kMax64 = std::numeric_limits<std::uint64_t>::max();

TEST(result_size, sums_and_products_at_the_limit) {
  struct row {
    std::uint64_t add, count, each;
    bool fits;
    std::uint64_t bytes;
    const char* why;
  };
  const row rows[] = {
      {0, 0, 0, true, 0, "nothing"},
      {kMaxResultBytes, 0, 7, true, kMaxResultBytes, "exactly the limit"},
      {kMaxResultBytes + 1, 0, 0, false, 0, "one past the limit"},
      {kMax64, 0, 0, false, 0, "a 64-bit size"},
      {0, 0x3FFFFFFF, 2, true, 0x7FFFFFFE, "hex of the largest input that fits"},
      {1, 0x3FFFFFFF, 2, true, 0x7FFFFFFF, "product plus one reaches the limit"},
      {2, 0x3FFFFFFF, 2, false, 0, "product plus two passes it"},
      {0, 0x40000000, 2, false, 0, "hex of one byte more"},
      {0, kMax64, kMax64, false, 0, "a product that overflows 64 bits"},
      {0, kMax64, 0, true, 0, "count times zero"},
      {0, 0, kMax64, true, 0, "zero times anything"},
      {1, 0x2AAAAAAA, 3, true, 0x7FFFFFFF, "URL worst case of the largest input that fits"},
      {1, 0x2AAAAAAB, 3, false, 0, "one input byte more"},
  };
  for (const row& r : rows) {
    SCOPED_TRACE(r.why);
    result_size size;
    size.add(r.add).add_times(r.count, r.each);
    EXPECT_EQ(size.fits(), r.fits);
    EXPECT_EQ(size.bytes(), r.bytes);
  }
}

TEST(result_size, once_over_stays_over) {
  result_size size(10);
  size.add(11);
  size.add(0);
  EXPECT_FALSE(size.fits());
  result_size parts(10);
  for (int i = 0; i < 5; ++i) parts.add(2);
  EXPECT_TRUE(parts.fits());
  EXPECT_EQ(parts.bytes(), 10u);
  parts.add(1).add_times(0, 0);
  EXPECT_FALSE(parts.fits());
}

TEST(fits_result, edges) {
  EXPECT_TRUE(fits_result(0));
  EXPECT_TRUE(fits_result(0x7FFFFFFF));
  EXPECT_FALSE(fits_result(0x80000000));
  EXPECT_FALSE(fits_result(kMax64));
  EXPECT_TRUE(fits_result(3, 3));
  EXPECT_FALSE(fits_result(4, 3));
}

TEST(worst_case_reserve, the_worst_case_capped_at_the_limit) {
  EXPECT_EQ(worst_case_reserve(10, 3, 20, 50), 50u);
  EXPECT_EQ(worst_case_reserve(10, 3, 20, 49), 49u);
  EXPECT_EQ(worst_case_reserve(10, 3, 19, 50), 49u);
  EXPECT_EQ(worst_case_reserve(0, 3, 7, 50), 7u);
  EXPECT_EQ(worst_case_reserve(kMax64, kMax64, kMax64, kMaxResultBytes), kMaxResultBytes);
}

// Appending one unit at a time up to a small limit: every append within the
// limit is allowed, the first past it refused, and the capacity never grows
// past the limit on the way.
template <class Buffer>
void fill_to_limit(std::size_t limit, std::size_t step) {
  Buffer out;
  // A string's first heap buffer may be twice its inline room.
  const std::size_t first_capacity = 2 * out.capacity();
  std::size_t appended = 0;
  while (make_room(out, step, limit)) {
    out.insert(out.end(), step, {});
    appended += step;
    // libc++ rounds a string's capacity up to 16 bytes less its terminator.
    ASSERT_LE(out.capacity(), std::max(limit, first_capacity) | 15) << "after " << appended;
  }
  EXPECT_EQ(out.size(), limit / step * step);
  EXPECT_GT(out.size() + step, limit);
}

TEST(make_room, grows_up_to_the_limit_and_no_further) {
  for (const std::size_t limit : {1u, 2u, 15u, 16u, 17u, 1000u, 4099u}) {
    for (const std::size_t step : {1u, 3u, 7u}) {
      SCOPED_TRACE(std::to_string(limit) + " in steps of " + std::to_string(step));
      fill_to_limit<std::string>(limit, step);
      fill_to_limit<std::vector<std::uint32_t>>(limit, step);
    }
  }
}

TEST(make_room, refuses_without_touching_the_buffer) {
  std::string out = "abc";
  const std::size_t capacity = out.capacity();
  EXPECT_FALSE(make_room(out, 8, 10));
  EXPECT_FALSE(make_room(out, kMax64 >> 1, kMaxResultBytes));
  EXPECT_EQ(out, "abc");
  EXPECT_EQ(out.capacity(), capacity);
  EXPECT_TRUE(make_room(out, 7, 10));
  EXPECT_GE(out.capacity(), 10u);
  EXPECT_TRUE(make_room(out, 0, 3));  // nothing more is always allowed at the limit
}

}  // namespace
}  // namespace zul
