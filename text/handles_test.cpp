// The handle layer: contents survive growth, a locked block never moves,
// limits and nested locks hold, and null handles are harmless.
#include "text/handles.h"

#include <gtest/gtest.h>

#include <cstring>

namespace {

using namespace zul::text;

TEST(handles, growth_in_small_steps_keeps_the_contents) {
  owned_handle h(new_handle(4));
  ASSERT_TRUE(h);
  for (std::size_t size = 4; size < 20000; size += 1024) {
    ASSERT_TRUE(set_handle_size(h.get(), size + 1024));
    handle_lock lock(h.get());
    std::memset(lock.data() + size - 4, static_cast<int>(size % 251), 4);
  }
  handle_lock lock(h.get());
  for (std::size_t size = 4; size < 20000; size += 1024) {
    EXPECT_EQ(lock.data()[size - 1], size % 251) << size;
  }
}

TEST(handles, a_locked_block_does_not_move) {
  owned_handle h(new_handle(16));
  std::uint8_t* pinned = lock_handle(h.get());
  EXPECT_TRUE(set_handle_size(h.get(), 8)) << "shrinking stays in place";
  EXPECT_TRUE(set_handle_size(h.get(), 16)) << "regrowing within the block";
  EXPECT_FALSE(set_handle_size(h.get(), 1 << 20)) << "would have to move";
  EXPECT_EQ(get_handle_size(h.get()), 16u);
  EXPECT_EQ(lock_handle(h.get()), pinned);
  unlock_handle(h.get());
  EXPECT_FALSE(set_handle_size(h.get(), 1 << 20)) << "still locked once";
  unlock_handle(h.get());
  EXPECT_TRUE(set_handle_size(h.get(), 1 << 20));
  unlock_handle(h.get());  // one too many: no effect
  EXPECT_EQ(get_handle_size(h.get()), std::size_t{1} << 20);
}

TEST(handles, limits_and_null_handles) {
  EXPECT_EQ(new_handle(11, 10), nullptr);
  owned_handle h(new_handle(0, 10));
  ASSERT_TRUE(h);
  EXPECT_EQ(h.size(), 0u);
  EXPECT_TRUE(set_handle_size(h.get(), 10));
  EXPECT_FALSE(set_handle_size(h.get(), 11));
  EXPECT_EQ(h.size(), 10u);

  EXPECT_FALSE(set_handle_size(nullptr, 1));
  EXPECT_EQ(get_handle_size(nullptr), 0u);
  EXPECT_EQ(lock_handle(nullptr), nullptr);
  unlock_handle(nullptr);
  dispose_handle(nullptr);
}

}  // namespace
