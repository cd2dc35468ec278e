// The shared trap's mapping from C++ exceptions to host exception classes
// and messages, in order (the specific kinds before their base classes).
#include <gtest/gtest.h>

#include <any>
#include <new>
#include <stdexcept>
#include <string>
#include <typeinfo>
#include <vector>

#include "plugin/exceptions.h"

namespace {

template <class E>
std::exception_ptr make(E e) {
  return std::make_exception_ptr(e);
}

TEST(map_exception, classes_and_messages_in_order) {
  struct Row {
    std::exception_ptr error;
    const char* want_class;
    std::string want_message;
    const char* why;
  };
  struct custom : std::exception {
    const char* what() const noexcept override { return "custom"; }
  };
  std::vector<char> v;
  std::exception_ptr length_error;
  try {
    v.reserve(v.max_size() + 1);
  } catch (...) {
    length_error = std::current_exception();
  }
  std::exception_ptr bad_cast;
  try {
    std::any a = 1;
    (void)std::any_cast<std::string>(a);
  } catch (...) {
    bad_cast = std::current_exception();
  }
  const Row rows[] = {
      {make(std::bad_alloc()), "OutOfMemoryException", "Failed to allocate memory.", "allocation"},
      {make(std::range_error("r")), "OutOfBoundsException", "r", "range_error"},
      {make(std::out_of_range("o")), "OutOfBoundsException", "o",
       "out_of_range before logic_error"},
      {make(std::overflow_error("ov")), "OutOfBoundsException", "ov", "overflow_error"},
      {make(std::underflow_error("un")), "OutOfBoundsException", "un", "underflow_error"},
      {length_error, "RuntimeException", "vector::reserve", "length_error is a logic_error"},
      {make(std::invalid_argument("ia")), "RuntimeException", "ia", "other logic_error"},
      {make(std::runtime_error("rt")), "RuntimeException", "rt", "other runtime_error"},
      {bad_cast, "IllegalCastException", "bad any_cast", "bad_cast family"},
      {make(custom()), "RuntimeException", "custom", "other std::exception"},
      {make(42), "RuntimeException", "Sorry, but there was an unnamed C++ Exception.", "an int"},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.why);
    const TrappedError mapped = map_exception(row.error);
    EXPECT_STREQ(mapped.class_name, row.want_class);
    EXPECT_EQ(mapped.message, row.want_message);
  }
}

}  // namespace
