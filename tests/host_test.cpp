// The stand-in host itself: its ledger must notice leaks, double releases,
// undisposed or twice-disposed records and stale handles; its text
// conversions must be right for all eight encodings and give the same
// answers on every platform the tests run on (iconv on Linux, the Win32 code
// pages under Wine), code point by code point for the 8-bit encodings; its
// services must behave as the plug-in expects; loading errors name the file;
// and its declaration parser must read every declaration the library
// registers. Driven through a small fake plug-in and the resolver directly.
#include "host/host.h"

#include <gtest/gtest.h>

#include <cstring>
#include <stdexcept>
#include <thread>

#include "host/text_convert.h"
#include "tests/declarations.h"

namespace {

using namespace text_encoding;

using namespace zul_host;

template <class Fn>
Fn service(const Host& host, const char* name) {
  auto fn = reinterpret_cast<Fn>(host.resolver()(name));
  EXPECT_NE(fn, nullptr) << name;
  return fn;
}

class FakeHost : public ::testing::Test {
 protected:
  FakeHost() { host_.load(ZUL_FAKE_PLUGIN_PATH); }
  Host host_;
};

TEST_F(FakeHost, ledger_names_each_misuse) {
  struct {
    const char* declaration;
    const char* want;
    const char* why;
  } rows[] = {
      {"FakeLeakZUL(s as string) as integer", "string #", "a string made and never released"},
      {"FakeLeakZUL(s as string) as integer", "made by REALBuildString",
       "the report names the maker"},
      {"FakeDoubleUnlockZUL(s as string) as integer", "released once more than it was locked",
       "argument over-released"},
      {"FakeKeepRecordZUL(s as string) as integer", "was never disposed", "record kept"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    host_.call<std::int64_t>(row.declaration, utf8("abc"));
    EXPECT_NE(host_.last_ledger_report().find(row.want), std::string::npos)
        << host_.last_ledger_report();
  }
  host_.call<Str>("FakeEchoZUL(s as string) as string", utf8("abc"));
  EXPECT_EQ(host_.last_ledger_report(), "") << "a balanced call leaves the report empty";
}

TEST_F(FakeHost, dispose_twice_and_stale_handles_are_reported) {
  host_.begin_ledger();
  REALstring s = host_.make_string("x\xC3\xA9", kUTF8);
  REALstringData record;
  ASSERT_TRUE(service<host_sig::GetStringData>(host_, "PluginGetStringData")(s, kLatin1, &record));
  EXPECT_EQ(record.length, 2u);
  EXPECT_NE(static_cast<const unsigned char*>(record.data)[2], 0)
      << "no terminator after the bytes";
  auto dispose = service<host_sig::DisposeStringData>(host_, "PluginDisposeStringData");
  dispose(&record);
  dispose(&record);
  host_.release(s);
  auto unlock = service<host_sig::LockString>(host_, "REALUnlockString");
  unlock(s);  // already destroyed
  const std::string report = host_.ledger_report();
  EXPECT_NE(report.find("disposed twice"), std::string::npos) << report;
  EXPECT_NE(report.find("used after it was destroyed, by REALUnlockString"), std::string::npos)
      << report;
  EXPECT_EQ(host_.ref_count(s), 0);
}

TEST_F(FakeHost, every_type_crosses_the_call) {
  const std::string byte("\x07", 1);
  EXPECT_EQ(host_.call<double>("FakeSumZUL(a as integer, b as double, c as boolean, p as ptr, m as "
                               "MemoryBlock) as double",
                               std::int64_t{40}, 0.5, true, byte.data(), Block{"four", false}),
            40 + 0.5 + 1 + 7 + 4);
  EXPECT_EQ(host_.last_ledger_report(), "");
  const StrArray parts =
      host_.call<StrArray>("FakeSplitZUL(s as string) as string()", utf8("zero"));
  ASSERT_EQ(parts.items.size(), 3u);
  EXPECT_EQ(parts.items[0], utf8("zero"));
  EXPECT_EQ(parts.items[2], utf8("two"));
  EXPECT_EQ(host_.last_ledger_report(), "");
  EXPECT_EQ(
      host_.call<Block>("FakeBlockZUL(size as integer) as memoryblock", std::int64_t{3}).bytes,
      "zzz");
  EXPECT_EQ(host_.last_ledger_report(), "");
}

TEST_F(FakeHost, raised_exception_is_taken_by_the_call) {
  EXPECT_TRUE(host_.call<bool>("FakeRaiseZUL(message as string) as boolean", utf8("bad \xC3\xA9")));
  ASSERT_TRUE(host_.last_exception().has_value());
  EXPECT_EQ(*host_.last_exception(), (RaisedException{"RuntimeException", "bad \xC3\xA9", 42}));
  EXPECT_EQ(host_.last_ledger_report(), "");
  host_.call<Str>("FakeEchoZUL(s as string) as string", utf8("x"));
  EXPECT_FALSE(host_.last_exception().has_value()) << "each call starts without one";
}

TEST_F(FakeHost, call_rejects_mismatched_types) {
  EXPECT_THROW(host_.call<std::int64_t>("FakeEchoZUL(s as string) as string", utf8("x")),
               std::invalid_argument);
  EXPECT_THROW(host_.call<Str>("FakeEchoZUL(s as string) as string", std::int64_t{1}),
               std::invalid_argument);
  EXPECT_THROW(host_.call<Str>("NotThere(s as string) as string", utf8("x")),
               std::invalid_argument);
}

TEST(host_resolver, missing_and_late_services) {
  HostConfig config;
  config.missing = {"REALLockString"};
  config.null_first = {"REALSetPropValueString"};
  Host host(config);
  REALResolver resolve = host.resolver();
  EXPECT_EQ(resolve("REALLockString"), nullptr);
  EXPECT_EQ(resolve("REALSetPropValueString"), nullptr);
  EXPECT_NE(resolve("REALSetPropValueString"), nullptr);
  EXPECT_EQ(resolve("NoSuchService"), nullptr);
  EXPECT_EQ(host.lookups("REALSetPropValueString"), 2);
  auto load = service<host_sig::LoadGlobalMethod>(host, "REALLoadGlobalMethod");
  EXPECT_NE(load(nullptr, "LenB( s as string ) as integer"), nullptr);
  EXPECT_EQ(load(nullptr, "LenB(s as string) as integer"), nullptr) << "the exact declaration only";
}

TEST(host_services, memory_blocks_and_cap) {
  HostConfig config;
  config.block_cap = 100;
  Host host(config);
  host.begin_ledger();
  auto new_block = service<host_sig::NewMemoryBlock>(host, "newMemoryBlock");
  EXPECT_EQ(new_block(101), nullptr);
  auto new_instance = service<host_sig::NewInstance>(host, "PluginNewInstance");
  auto load_method = service<host_sig::LoadObjectMethod>(host, "REALLoadObjectMethod");
  auto handler =
      service<host_sig::CallWithExceptionHandler>(host, "PluginCallFunctionWithExceptionHandler");
  auto get_int = service<host_sig::GetPropValueInteger>(host, "REALGetPropValueInteger");
  auto unlock = service<host_sig::LockObject>(host, "REALUnlockObject");
  for (std::int64_t size : {std::int64_t{10}, std::int64_t{1000}}) {
    SCOPED_TRACE(size);
    REALobject block = new_instance("MemoryBlock");
    auto constructor = reinterpret_cast<host_sig::MemoryBlockConstructor>(
        load_method(block, "Constructor(bytes as Integer)"));
    struct Args {
      host_sig::MemoryBlockConstructor constructor;
      REALobject block;
      std::int64_t size;
    } args{constructor, block, size};
    REALobject raised = handler(
        [](void* p) {
          auto* a = static_cast<Args*>(p);
          a->constructor(a->block, a->size);
        },
        &args);
    std::int64_t got = -1;
    EXPECT_TRUE(get_int(block, "Size", &got));
    EXPECT_EQ(got, size > 100 ? 0 : size);
    EXPECT_EQ(raised != nullptr, size > 100);
    if (raised) {
      EXPECT_EQ(host.read_exception(raised)->class_name, "OutOfMemoryException");
      unlock(raised);
    }
    unlock(block);
  }
  EXPECT_FALSE(host.take_pending_exception().has_value()) << "the handler cleared it";
  EXPECT_EQ(host.ledger_report(), "");
}

TEST(host_services, unknown_classes_and_exception_names) {
  HostConfig config;
  config.unknown_classes = {"OutOfBoundsException"};
  Host host(config);
  auto new_instance = service<host_sig::NewInstance>(host, "PluginNewInstance");
  EXPECT_EQ(new_instance("OutOfBoundsException"), nullptr);
  EXPECT_EQ(new_instance("Dictionary"), nullptr);
  for (const char* name : {"OutOfMemoryException", "IllegalCastException", "NilObjectException"}) {
    REALobject e = new_instance(name);
    ASSERT_NE(e, nullptr) << name;
    host.release(e);
  }
}

TEST(text_convert, round_trips_and_refusals) {
  const std::string text =
      "A\xC3\xA9\xE2\x82\xAC";  // "Aé€": in every encoding but Latin 1 and ASCII
  const std::uint32_t all[] = {kMacRoman, kUTF16, kWindowsLatin1, kUTF8, kUTF32};
  for (std::uint32_t e : all) {
    SCOPED_TRACE(encoding_label(e));
    const auto there = convert_text(text, kUTF8, e);
    ASSERT_TRUE(there.has_value());
    EXPECT_EQ(convert_text(*there, e, kUTF8), text);
  }
  struct {
    std::string bytes;
    std::uint32_t from, to;
    std::optional<std::string> want;
    const char* why;
  } rows[] = {
      {"\xE9", kUnknown, kUTF8, "\xC3\xA9", "no declared encoding reads as Latin 1"},
      {std::string("\xFF\xFE\x7A\x00", 4), kUTF16, kUTF8, "\xEF\xBB\xBFz", "mark kept"},
      {"\xC3\xA9", kUTF8, kUTF32, std::string("\xE9\0\0\0", 4), "to UTF-32"},
      {std::string("\x3D\xD8\x00\xDE", 4), kUTF16, kUTF8, "\xF0\x9F\x98\x80", "surrogate pair"},
      {std::string("\x00\xDE", 2), kUTF16, kUTF8, std::nullopt, "lone low surrogate"},
      {"\xC3", kUTF8, kUTF8, "\xC3", "same encoding is a plain copy"},
      {"abc", 0x1234, kUTF8, std::nullopt, "unknown encoding number"},
      {"\xC3\xA9", kUTF8, kASCII, std::nullopt, "U+00E9 is not ASCII"},
      {"\xE2\x82\xAC", kUTF8, kLatin1, std::nullopt, "the euro sign is not Latin 1"},
      {"\xE2\x82\xAC", kUTF8, kUnknown, std::nullopt, "bytes without an encoding are Latin 1"},
      {"\xE2\x89\xA0", kUTF8, kWindowsLatin1, std::nullopt, "U+2260 has no Windows-1252 byte"},
      {"\xE2\x82\xAD", kUTF8, kMacRoman, std::nullopt, "U+20AD has no Mac OS Roman byte"},
      {"\xC3\x28", kUTF8, kUTF16, std::nullopt, "broken UTF-8"},
      {"\xED\xA0\x80", kUTF8, kUTF16, std::nullopt, "UTF-8 of a surrogate"},
      {"\xC0\xAF", kUTF8, kUTF16, std::nullopt, "overlong UTF-8"},
      {std::string("\x00\xD8\x00\x00", 4), kUTF32, kUTF8, std::nullopt, "UTF-32 surrogate"},
      {std::string("\x00\x00\x11\x00", 4), kUTF32, kUTF8, std::nullopt, "beyond U+10FFFF"},
      {std::string("\x3D\xD8", 2), kUTF16, kUTF32, std::nullopt, "high surrogate at the end"},
      {std::string("\x3D\xD8\x41\x00", 4), kUTF16, kUTF8, std::nullopt, "high, then no low"},
      {std::string("A\0B", 3), kUTF16, kUTF8, std::nullopt, "odd-length UTF-16"},
      {std::string("A\0\0\0B", 5), kUTF32, kUTF16, std::nullopt, "UTF-32 of 5 bytes"},
      {"a\xE2\x82", kUTF8, kUTF32, std::nullopt, "UTF-8 cut short"},
      {"\xF4\x90\x80\x80", kUTF8, kUTF16, std::nullopt, "UTF-8 beyond U+10FFFF"},
      {std::string("\x00\xF6\x01\x00", 4), kUTF32, kUTF16, std::string("\x3D\xD8\x00\xDE", 4),
       "pair made"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(convert_text(row.bytes, row.from, row.to), row.want);
  }
}

std::string utf32(char32_t c) {
  std::string out;
  for (int k = 0; k < 4; ++k) out += static_cast<char>((c >> (8 * k)) & 0xFF);
  return out;
}

// Mac OS Roman bytes where the system converters disagree, and a few more,
// as macOS maps them; the host gives these on every platform.
constexpr std::pair<unsigned char, char32_t> kMacRomanLandmarks[] = {
    {0x80, 0x00C4}, {0xBD, 0x03A9}, {0xC6, 0x2206}, {0xCA, 0x00A0},
    {0xDB, 0x20AC}, {0xF0, 0xF8FF}, {0xFF, 0x02C7}};

// Bytes 0x80 to 0x9F of Windows-1252; 0 marks the five undefined ones. From
// 0xA0 on it is ISO Latin 1.
constexpr char32_t kWindows1252C1[32] = {
    0x20AC, 0,      0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021, 0x02C6, 0x2030, 0x0160,
    0x2039, 0x0152, 0,      0x017D, 0,      0,      0x2018, 0x2019, 0x201C, 0x201D, 0x2022,
    0x2013, 0x2014, 0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0,      0x017E, 0x0178};

TEST(text_convert, every_byte_of_the_8_bit_encodings) {
  for (int b = 0; b < 0x100; ++b) {
    SCOPED_TRACE(b);
    const std::string byte(1, static_cast<char>(b));
    for (std::uint32_t wide : {kUTF16, kUTF32}) {
      const auto there = convert_text(byte, kLatin1, wide);
      ASSERT_TRUE(there.has_value());
      EXPECT_EQ(convert_text(*there, wide, kLatin1), byte);
    }
    if (b < 0x80) continue;
    const auto roman = convert_text(byte, kMacRoman, kUTF32);
    ASSERT_TRUE(roman.has_value());
    EXPECT_EQ(convert_text(*roman, kUTF32, kMacRoman), byte);
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

TEST(text_convert, mac_roman_as_macos_maps_it) {
  for (const auto& [byte, character] : kMacRomanLandmarks) {
    EXPECT_EQ(convert_text(std::string(1, static_cast<char>(byte)), kMacRoman, kUTF32),
              utf32(character))
        << int{byte};
  }
}

TEST(parse_declaration, every_registered_form) {
  for (const char* d : kDeclarations) {
    const auto parsed = parse_declaration(d);
    ASSERT_TRUE(parsed.has_value()) << d;
    EXPECT_NE(parsed->result, ValueType::none) << d;
  }
  struct {
    std::string_view text;
    std::optional<Declaration> want;
    const char* why;
  } rows[] = {
      {"GetStringsFromDataZUL(data as ptr, size as Integer, MinLength as Integer = 0) as string()",
       Declaration{"GetStringsFromDataZUL",
                   {{"data", ValueType::ptr, {}},
                    {"size", ValueType::integer, {}},
                    {"MinLength", ValueType::integer, "0"}},
                   ValueType::string_array},
       "array result, default value"},
      {"_yDecodeMemoryZUL(data as memoryblock) as memoryblock",
       Declaration{
           "_yDecodeMemoryZUL", {{"data", ValueType::memory_block, {}}}, ValueType::memory_block},
       "lower-case memoryblock"},
      {"RandomBytesStringZUL(Length as integer, ASCII as boolean=false) as string",
       Declaration{"RandomBytesStringZUL",
                   {{"Length", ValueType::integer, {}}, {"ASCII", ValueType::boolean, "false"}},
                   ValueType::string},
       "no blanks around ="},
      {"StringANDZUL(a as string,b as string) as string",
       Declaration{"StringANDZUL",
                   {{"a", ValueType::string, {}}, {"b", ValueType::string, {}}},
                   ValueType::string},
       "no blank after the comma"},
      {"ScientificStrZUL(d as double, digits as integer) as string",
       Declaration{"ScientificStrZUL",
                   {{"d", ValueType::double_, {}}, {"digits", ValueType::integer, {}}},
                   ValueType::string},
       "double"},
      {"LenB( s as string ) as integer",
       Declaration{"LenB", {{"s", ValueType::string, {}}}, ValueType::integer},
       "blanks inside the parentheses"},
      {"Operator_Convert() As Ptr", Declaration{"Operator_Convert", {}, ValueType::ptr},
       "no parameters, As"},
      {"Constructor(bytes as Integer)",
       Declaration{"Constructor", {{"bytes", ValueType::integer, {}}}, ValueType::none},
       "no result"},
      {"F(a as string()) as string", std::nullopt, "array parameter"},
      {"F(a string) as string", std::nullopt, "missing as"},
      {"F(a as text) as string", std::nullopt, "unknown type"},
      {"F(a as string", std::nullopt, "unclosed"},
      {"(a as string) as string", std::nullopt, "no name"},
      {"F(a as string) string", std::nullopt, "result without as"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(parse_declaration(row.text), row.want);
  }
}

TEST(host_library, load_failure_names_the_file) {
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
