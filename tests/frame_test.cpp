// The frame compiled into this test binary, pointed at the stand-in host's
// resolver: result strings from every encoding path, rbText's forms and
// rbData's holders, exceptions raised to the host. Every such test ends with
// the host's ledger balanced. Also the two failure policies and the trap's
// mapping from C++ exceptions to host exception classes and messages, in
// order (the specific kinds before their base classes), also with every
// allocation failing.
#include <gtest/gtest.h>

#include <any>
#include <cstring>
#include <new>
#include <optional>
#include <stdexcept>
#include <string>
#include <typeinfo>
#include <vector>

#include "host/host.h"
#include "plugin/exceptions.h"
#include "plugin/host_services.h"
#include "plugin/rb_data.h"
#include "plugin/rb_text.h"
#include "plugin/results.h"
#include "tests/failing_allocator.h"

namespace {

using zul_host::Str;
namespace enc = text_encoding;

std::string utf32(std::initializer_list<std::uint32_t> units) {
  std::string out(units.size() * 4, '\0');
  std::memcpy(out.data(), std::data(units), out.size());
  return out;
}

std::string utf16(std::initializer_list<std::uint16_t> units) {
  std::string out(units.size() * 2, '\0');
  std::memcpy(out.data(), std::data(units), out.size());
  return out;
}

class Frame : public ::testing::Test {
 protected:
  Frame() {
    host_.load(ZUL_PLUGIN_PATH);
    gResolver = host_.resolver();
    rbversion_rbversion = 2019.0;
    host_.begin_ledger();
  }
  ~Frame() override { EXPECT_EQ(host_.ledger_report(), ""); }

  // Builds, reads back and releases one result string.
  Str build(const std::string& bytes, std::uint32_t encoding) {
    REALstring s =
        REALBuildUnicodeString(bytes.data(), static_cast<std::int64_t>(bytes.size()), encoding);
    Str got = host_.read(s);
    if (s) host_.release(s);
    return got;
  }

  zul_host::Host host_;
};

TEST_F(Frame, build_string_tags_and_ascii_demotion) {
  struct {
    std::string bytes;
    std::uint32_t encoding;
    Str want;
    const char* why;
  } rows[] = {
      {"abc", enc::kUnknown, {"abc", enc::kASCII}, "unknown bytes, all ASCII"},
      {"a\xE9", enc::kUnknown, {"a\xE9", enc::kUnknown}, "unknown bytes kept"},
      {"a\xE9", enc::kWindowsLatin1, {"a\xE9", enc::kWindowsLatin1}, "Windows Latin 1 kept"},
      {"abc", enc::kWindowsLatin1, {"abc", enc::kASCII}, "Windows Latin 1 demoted"},
      {"a\xE9", enc::kMacRoman, {"a\xE9", enc::kMacRoman}, "Mac OS Roman kept"},
      {"abc", enc::kMacRoman, {"abc", enc::kASCII}, "Mac OS Roman demoted"},
      {"a\xE9", enc::kASCII, {"a\xE9", enc::kASCII}, "ASCII passed through as given"},
      {"abc", enc::kUTF8, {"abc", enc::kUTF8}, "UTF-8 is never demoted"},
      {"abc", enc::kLatin1, {"abc", enc::kLatin1}, "other encodings unchanged"},
      {utf16({0xE9, 'z'}), enc::kUTF16, {"\xC3\xA9z", enc::kUTF8}, "UTF-16 becomes UTF-8"},
      {utf32({0x1F600}), enc::kUTF32, {"\xF0\x9F\x98\x80", enc::kUTF8}, "UTF-32 becomes UTF-8"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(build(row.bytes, row.encoding), row.want);
  }
}

TEST_F(Frame, build_string_empty_and_oversized_give_null) {
  for (std::uint32_t e : {enc::kMacRoman, enc::kUTF16, enc::kUTF32, enc::kUTF8, enc::kUnknown}) {
    EXPECT_EQ(REALBuildUnicodeString("x", 0, e), nullptr);
    EXPECT_EQ(REALBuildUnicodeString(nullptr, 1, e), nullptr);
    EXPECT_EQ(REALBuildUnicodeString("x", std::int64_t{0x80000000}, e), nullptr);
  }
}

// Hosts before 2013.0 cannot convert UTF-32; the library makes UTF-16.
TEST_F(Frame, build_string_utf32_on_older_hosts) {
  struct {
    double version;
    std::string bytes;
    std::string want;
    const char* why;
  } rows[] = {
      {2012.5, utf32({0x1F600}), "\xF0\x9F\x98\x80", "surrogate pair"},
      {2012.5, utf32({0x41, 0x110000}), "A\xEF\xBF\xBD", "past U+10FFFF becomes U+FFFD"},
      {2012.5, utf32({0x41, 0xD800, 0x42}), "AB", "a lone surrogate is dropped"},
      {2012.5, utf32({0x41, 0x42}).substr(0, 7), "A", "trailing bytes past a unit ignored"},
      {2011.0, utf32({0xE9}), "\xC3\xA9", "oldest hosts tag and convert UTF-16"},
      {2013.0, utf32({0xE9, 0x1F600}), "\xC3\xA9\xF0\x9F\x98\x80", "host converts"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    rbversion_rbversion = row.version;
    EXPECT_EQ(build(row.bytes, enc::kUTF32), (Str{row.want, enc::kUTF8}));
  }
  // 200 supplementary code points: exactly the stack buffer's limit, and past it.
  for (int count : {199, 200, 201}) {
    SCOPED_TRACE(count);
    rbversion_rbversion = 2012.5;
    std::string in, want;
    for (int i = 0; i < count; ++i) {
      in += utf32({0x1F600});
      want += "\xF0\x9F\x98\x80";
    }
    EXPECT_EQ(build(in, enc::kUTF32), (Str{want, enc::kUTF8}));
  }
}

TEST_F(Frame, text_view_forms) {
  struct {
    Str in;
    std::string want_utf8;
    std::vector<std::uint32_t> want_utf32;
    bool want_ascii;
    const char* why;
  } rows[] = {
      {{"Hi", enc::kWindowsLatin1}, "Hi", {'H', 'i'}, true, "ASCII shortcut"},
      {{"", enc::kUTF8}, "", {}, true, "empty string"},
      {{"A\xE9", enc::kUnknown}, "A\xC3\x88", {'A', 0xC8}, false, "unknown bytes: Mac OS Roman"},
      {{"A\xE9", enc::kLatin1}, "A\xC3\xA9", {'A', 0xE9}, false, "Latin 1"},
      {{"\x80", enc::kWindowsLatin1}, "\xE2\x82\xAC", {0x20AC}, false, "Windows Latin 1 euro"},
      {{utf16({0xFEFF, 'z'}), enc::kUTF16},
       "\xEF\xBB\xBFz",
       {'z'},
       false,
       "mark kept in UTF-8 only"},
      {{"A\xF0\x9F\x98\x80", enc::kUTF8}, "A\xF0\x9F\x98\x80", {'A', 0x1F600}, false, "non-BMP"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    REALstring s = host_.make_string(row.in.bytes, row.in.encoding);
    {
      rbText view(s);
      EXPECT_EQ(view.is_ascii(), row.want_ascii);
      EXPECT_EQ(view.utf8(), row.want_utf8);
      EXPECT_EQ(view.GetUTF8()[view.LengthUTF8()], '\0');
      view.ConvertUTF32();
      EXPECT_EQ(std::vector<std::uint32_t>(view.utf32().begin(), view.utf32().end()),
                row.want_utf32);
      EXPECT_EQ(view.utf32().data()[view.utf32().size()], 0u);
    }
    host_.release(s);
  }
}

TEST_F(Frame, text_view_utf16_marks) {
  struct {
    std::string bytes;
    std::vector<std::uint16_t> want;
    const char* why;
  } rows[] = {
      {utf16({0xFEFF, 'A', 'B'}), {'A', 'B'}, "mark dropped"},
      {utf16({0xFFFE, 0x4100, 0x4200}), {'A', 'B'}, "opposite order swapped, mark dropped"},
      {utf16({'A', 0xFEFF}), {'A', 0xFEFF}, "a mark inside the text stays"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    REALstring s = host_.make_string(row.bytes, enc::kUTF16);
    {
      rbText view(s);
      view.ConvertUTF16();
      EXPECT_EQ(std::vector<std::uint16_t>(view.utf16().begin(), view.utf16().end()), row.want);
    }
    host_.release(s);
  }
}

TEST_F(Frame, text_view_of_null_calls_nothing) {
  const int lookups = host_.service_calls("REALLockString");
  rbText view(nullptr);
  EXPECT_EQ(view.LengthUTF8(), 0);
  EXPECT_EQ(*view.GetUTF8(), '\0');
  view.ConvertUTF16();
  view.ConvertUTF32();
  EXPECT_TRUE(view.utf16().empty());
  EXPECT_TRUE(view.utf32().empty());
  EXPECT_EQ(host_.service_calls("REALLockString"), lookups);
}

TEST_F(Frame, data_holder_reads_stored_bytes) {
  {
    rbData none(static_cast<REALstring>(nullptr));
    EXPECT_EQ(none.data, nullptr);
    EXPECT_EQ(none.length, 0);
  }
  REALstring empty = host_.make_string("", enc::kUTF8);
  REALstring nuls = host_.make_string(std::string("a\0b\0", 4), enc::kUnknown);
  {
    rbData e(empty);
    rbData n(nuls);
    EXPECT_EQ(e.length, 0);
    EXPECT_EQ(host_.ref_count(empty), 2) << "the empty string is locked too";
    EXPECT_EQ(n.view(), std::string_view("a\0b\0", 4));
  }
  EXPECT_EQ(host_.ref_count(empty), 1);
  host_.release(empty);
  host_.release(nuls);

  REALmemoryBlock block = host_.make_block("bytes");
  {
    rbData b(block);
    EXPECT_EQ(b.view(), "bytes");
  }
  host_.release(block);
}

TEST_F(Frame, string_array_builder) {
  StringArrayBuilder builder;
  builder.append("one", enc::kASCII);
  builder.append(nullptr);
  builder.append("", enc::kASCII);
  builder.append("tw\xC3\xB6", enc::kUTF8);
  REALarray array = builder.take();
  const zul_host::StrArray got = host_.read(array);
  ASSERT_EQ(got.items.size(), 2u);
  EXPECT_EQ(got.items[0], (Str{"one", enc::kASCII}));
  EXPECT_EQ(got.items[1], (Str{"tw\xC3\xB6", enc::kUTF8}));
  host_.release(array);
}

TEST_F(Frame, memory_block_copies_bytes) {
  REALmemoryBlock block = REALNewMemoryBlock(5, "hello");
  ASSERT_NE(block, nullptr);
  EXPECT_EQ(host_.read(block).bytes, "hello");
  host_.release(block);
  EXPECT_EQ(REALNewMemoryBlock(0, "x"), nullptr);
  EXPECT_EQ(REALNewMemoryBlock(-5, "x"), nullptr);
}

// A block of 2 GiB or more is made through the host class and its
// constructor under the host's exception handler; the constructor's own
// exception stays inside, and the library raises its own instead.
TEST_F(Frame, huge_memory_block_failure_is_reported_once) {
  EXPECT_EQ(REALNewMemoryBlock(std::int64_t{0x80000000}, nullptr), nullptr);
  EXPECT_GE(host_.service_calls("PluginCallFunctionWithExceptionHandler"), 1);
  const auto raised = host_.take_pending_exception();
  ASSERT_TRUE(raised.has_value());
  EXPECT_EQ(raised->class_name, "OutOfMemoryException");
  EXPECT_EQ(raised->message, "Failed to allocate a memoryblock with 2147483648 bytes in size.");
  EXPECT_FALSE(host_.take_pending_exception().has_value());
}

TEST_F(Frame, raise_exception_sets_class_message_and_number) {
  struct {
    const char* class_name;
    const char* message;
    zul_host::RaisedException want;
    const char* why;
  } rows[] = {
      {"OutOfMemoryException",
       "Failed to allocate memory.",
       {"OutOfMemoryException", "Failed to allocate memory.", 0},
       "known class"},
      {"OutOfBoundsException", "", {"OutOfBoundsException", "", 0}, "empty message"},
      {"OutOfBoundsException", nullptr, {"OutOfBoundsException", "", 0}, "no message"},
      {"NotAClass", "m\xC3\xA9", {"RuntimeException", "m\xC3\xA9", 0}, "unknown class falls back"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    RaiseException(row.class_name, row.message, 0);
    EXPECT_EQ(host_.take_pending_exception(), std::optional(row.want));
  }
}

TEST_F(Frame, trap_raises_and_returns_the_empty_result) {
  const int got = trapped(-1, []() -> int { throw std::out_of_range("index 9"); });
  EXPECT_EQ(got, -1);
  EXPECT_EQ(host_.take_pending_exception(),
            std::optional(zul_host::RaisedException{"OutOfBoundsException", "index 9", 0}));
  EXPECT_EQ(trapped(-1, [] { return 7; }), 7);
  EXPECT_FALSE(host_.take_pending_exception().has_value());
}

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
