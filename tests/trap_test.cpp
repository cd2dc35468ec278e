// The two failure policies and the trap's mapping from C++ exceptions to
// host exception classes and messages, in order (the specific kinds before
// their base classes), also with every allocation failing.
#include <gtest/gtest.h>

#include <any>
#include <new>
#include <stdexcept>
#include <string>
#include <typeinfo>
#include <vector>

#include "plugin/exceptions.h"
#include "tests/failing_allocator.h"

namespace {

struct custom : std::exception {
  const char* what() const noexcept override { return "custom"; }
};

struct Row {
  void (*raise)();
  const char* want_class;
  const char* want_message;
  const char* why;
};

const Row kRows[] = {
    {[] { throw std::bad_alloc(); }, "OutOfMemoryException", "Failed to allocate memory.",
     "allocation"},
    {[] { throw std::range_error("r"); }, "OutOfBoundsException", "r", "range_error"},
    {[] { throw std::out_of_range("o"); }, "OutOfBoundsException", "o",
     "out_of_range before logic_error"},
    {[] { throw std::overflow_error("ov"); }, "OutOfBoundsException", "ov", "overflow_error"},
    {[] { throw std::underflow_error("un"); }, "OutOfBoundsException", "un", "underflow_error"},
    {[] {
       std::vector<char> v;
       v.reserve(v.max_size() + 1);
     },
     "RuntimeException", "vector::reserve", "length_error is a logic_error"},
    {[] { throw std::invalid_argument("ia"); }, "RuntimeException", "ia", "other logic_error"},
    {[] { throw std::runtime_error("rt"); }, "RuntimeException", "rt", "other runtime_error"},
    {[] { throw std::bad_any_cast(); }, "IllegalCastException", "bad any_cast", "bad_cast family"},
    {[] { throw custom(); }, "RuntimeException", "custom", "other std::exception"},
    {[] { throw 42; }, "RuntimeException", "Sorry, but there was an unnamed C++ Exception.",
     "an int"},
};

// Maps the exception that row raises, with allocation failing or not. The
// texts are copied out while the exception is still being handled.
void expect_mapping(const Row& row, bool fail_allocations) {
  SCOPED_TRACE(row.why);
  std::string got_class, got_message;
  try {
    row.raise();
    FAIL() << "nothing thrown";
  } catch (...) {
    TrappedError mapped{};
    if (fail_allocations) {
      zul::testing::fail_allocations guard;
      mapped = map_current_exception();
    } else {
      mapped = map_current_exception();
    }
    got_class = mapped.class_name;
    got_message = mapped.message;
  }
  EXPECT_EQ(got_class, row.want_class);
  EXPECT_EQ(got_message, row.want_message);
}

TEST(map_current_exception, classes_and_messages_in_order_allocating_nothing) {
  for (const bool fail_allocations : {false, true}) {
    for (const Row& row : kRows) expect_mapping(row, fail_allocations);
  }
}

// With no host attached nothing is raised; what matters is that neither
// policy allocates (or ends the process) once the body has thrown.
TEST(policies, give_the_empty_result_when_memory_is_gone) {
  int raised = 0, silent = 0, passed = 0;
  bool allocation_failed = false;
  {
    zul::testing::fail_allocations guard;
    raised = trapped(-1, []() -> int { throw std::bad_alloc(); });
    silent = quietly(-1, []() -> int { throw std::bad_alloc(); });
    passed = trapped(-1, []() -> int { return 7; });
    try {
      ::operator delete(::operator new(1));
    } catch (const std::bad_alloc&) {
      allocation_failed = true;
    }
  }
  EXPECT_EQ(raised, -1);
  EXPECT_EQ(silent, -1);
  EXPECT_EQ(passed, 7);
  EXPECT_TRUE(allocation_failed);
}

}  // namespace
