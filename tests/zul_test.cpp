// The zul tool: how it reads each argument form, which overload it picks,
// how it prints results, and its exit statuses, run in process against the
// fake plug-in and once as the built program.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "host/zul_cli.h"

namespace {

using namespace text_encoding;

using namespace zul_host;

TEST(parse_argument, forms_by_type) {
  struct {
    ValueType type;
    std::string_view text;
    std::optional<Str> want;  // string view of the parsed value; nullopt: rejected
    const char* why;
  } rows[] = {
      {ValueType::string, "héllo", utf8("héllo"), "plain text is UTF-8"},
      {ValueType::string, "hex:C3a9", tagged("\xC3\xA9", kUnknown),
       "hex bytes, no declared encoding"},
      {ValueType::string, "hex:C3A", std::nullopt, "odd hex digits"},
      {ValueType::string, "hex:ZZ", std::nullopt, "not hex"},
      {ValueType::string, "@null", null_string(), "the null string"},
      {ValueType::string, "latin1:é", tagged("\xE9", kLatin1), "converted to Latin 1"},
      {ValueType::string, "cp1252:€", tagged("\x80", kWindowsLatin1), "converted to Windows-1252"},
      {ValueType::string, "macroman:È", tagged("\xE9", kMacRoman), "converted to Mac OS Roman"},
      {ValueType::string, "utf16:A", tagged(std::string("A\0", 2), kUTF16), "UTF-16 host order"},
      {ValueType::string, "utf32:A", tagged(std::string("A\0\0\0", 4), kUTF32),
       "UTF-32 host order"},
      {ValueType::string, "ascii:é", std::nullopt, "does not convert to ASCII"},
      {ValueType::string, "file:/no/such/file", std::nullopt, "unreadable file"},
      {ValueType::string, "utf8file:/no/such/file", std::nullopt, "unreadable UTF-8 file"},
      {ValueType::string, "12", utf8("12"), "a string takes anything"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    const auto got = parse_argument(row.type, row.text);
    ASSERT_EQ(got.has_value(), row.want.has_value());
    if (got) {
      EXPECT_EQ(got->string, *row.want);
    }
  }
  struct {
    ValueType type;
    std::string_view text;
    bool ok;
    double want;
  } scalars[] = {
      {ValueType::integer, "-42", true, -42},  {ValueType::integer, "+7", true, 7},
      {ValueType::integer, "4.5", false, 0},   {ValueType::integer, "", false, 0},
      {ValueType::integer, "12a", false, 0},   {ValueType::double_, "0.25", true, 0.25},
      {ValueType::double_, "1e3", true, 1000}, {ValueType::double_, "x", false, 0},
      {ValueType::boolean, "TRUE", true, 1},   {ValueType::boolean, "0", true, 0},
      {ValueType::boolean, "yes", false, 0},
  };
  for (const auto& row : scalars) {
    SCOPED_TRACE(row.text);
    const auto got = parse_argument(row.type, row.text);
    ASSERT_EQ(got.has_value(), row.ok);
    if (!got) continue;
    const double value = row.type == ValueType::integer   ? static_cast<double>(got->integer)
                         : row.type == ValueType::double_ ? got->real
                                                          : (got->boolean ? 1.0 : 0.0);
    EXPECT_EQ(value, row.want);
  }
  // A file's bytes as they are: without an encoding, or tagged, never converted.
  const auto path = std::filesystem::temp_directory_path() / "zul-parse-argument.txt";
  std::ofstream(path, std::ios::binary) << "caf\xC3\xA9";
  for (const auto& [form, encoding] : {std::pair{"file:", kUnknown}, std::pair{"utf8file:", kUTF8},
                                       std::pair{"latin1file:", kLatin1}}) {
    const auto got = parse_argument(ValueType::string, form + path.string());
    ASSERT_TRUE(got.has_value()) << form;
    EXPECT_EQ(got->string, tagged("caf\xC3\xA9", encoding)) << form;
  }
  std::filesystem::remove(path);
  const auto block = parse_argument(ValueType::memory_block, "hex:0001");
  ASSERT_TRUE(block.has_value());
  EXPECT_EQ(block->block, (Block{std::string("\0\1", 2), false}));
}

TEST(format_value, text_hex_numbers_and_arrays) {
  auto str = [](Str s) {
    DynamicValue v;
    v.type = ValueType::string;
    v.string = std::move(s);
    return v;
  };
  DynamicValue half;
  half.type = ValueType::double_;
  half.real = 0.5;
  DynamicValue yes;
  yes.type = ValueType::boolean;
  yes.boolean = true;
  DynamicValue list;
  list.type = ValueType::string_array;
  list.array.items = {utf8("a"), tagged("\xE9", kLatin1)};
  struct {
    DynamicValue value;
    std::string want;
    bool want_hex;
    const char* why;
  } rows[] = {
      {str(utf8("caf\xC3\xA9")), "caf\xC3\xA9", false, "printable UTF-8"},
      {str(tagged("\xE9", kLatin1)), "\xC3\xA9", false, "Latin 1 shown as text"},
      {str(tagged("\x02\x03", kASCII)), "0203", true, "control bytes as hex"},
      {str(tagged("\xC3", kUnknown)), "C3", true, "invalid UTF-8 as hex"},
      {str(null_string()), "", false, "the null string"},
      {half, "0.5", false, "shortest double"},
      {yes, "true", false, "boolean"},
      {list, "a\n\xC3\xA9", false, "one element a line"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    bool hex = false;
    EXPECT_EQ(format_value(row.value, &hex), row.want);
    EXPECT_EQ(hex, row.want_hex);
  }
}

TEST(choose_overload, kinds_counts_and_defaults) {
  Registration r;
  for (const char* d :
       {"F(a as integer) as string", "F(a as string) as string",
        "G(a as string, n as integer = 3) as string", "G(a as string, b as string) as string"}) {
    r.methods.push_back({d});
  }
  struct {
    std::string_view name;
    std::vector<std::string> args;
    std::optional<std::string> want;
    std::int64_t want_last_integer;
    const char* why;
  } rows[] = {
      {"F", {"5"}, "F(a as integer) as string", 5, "integer literal prefers the integer overload"},
      {"F", {"5x"}, "F(a as string) as string", 0, "anything else goes to the string one"},
      {"G", {"s", "4"}, "G(a as string, n as integer = 3) as string", 4, "given explicitly"},
      {"G", {"s", "t"}, "G(a as string, b as string) as string", 0, "second overload"},
      {"G", {"s"}, "G(a as string, n as integer = 3) as string", 3, "default filled in"},
      {"G", {}, std::nullopt, 0, "a has no default"},
      {"H", {"x"}, std::nullopt, 0, "unknown name"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    std::vector<DynamicValue> values;
    EXPECT_EQ(choose_overload(r, row.name, row.args, values), row.want);
    if (row.want && values.back().type == ValueType::integer) {
      EXPECT_EQ(values.back().integer, row.want_last_integer);
    }
  }
}

struct ZulRun {
  int status;
  std::string out, err;
};

ZulRun zul(std::vector<std::string> args) {
  std::ostringstream out, err;
  const int status = run_zul(args, ZUL_FAKE_PLUGIN_PATH, out, err);
  return {status, out.str(), err.str()};
}

TEST(run_zul, statuses_and_output) {
  struct {
    std::vector<std::string> args;
    int want_status;
    std::string want_out;
    std::string want_err_part;
    const char* why;
  } rows[] = {
      {{"call", "FakeEchoZUL", "hi"}, 0, "hi\n", "", "string result"},
      {{"call", "FakeSumZUL", "1", "0.5", "true", "hex:02", "abc"}, 0, "7.5\n", "", "every type"},
      {{"call", "FakeSumZUL", "1", "x", "true", "a", "b"}, 2, "", "fit no overload", "bad double"},
      {{"call", "FakeSplitZUL", "@null"}, 0, "one\ntwo\n", "", "array"},
      {{"call", "FakeBlockZUL", "2"}, 0, "zz\n", "", "memory block"},
      {{"call", "FakeRaiseZUL", "boom"}, 1, "", "RuntimeException: boom", "raised exception"},
      {{"call", "FakeLeakZUL", "x"}, 3, "1\n", "still has 1 reference", "unbalanced ledger"},
      {{"call", "Missing", "x"}, 2, "", "no function named Missing", "unknown name"},
      {{"call"}, 2, "", "usage", "no name"},
      {{"frobnicate"}, 2, "", "usage", "unknown command"},
      {{"--host-version", "soon", "list"}, 2, "", "--host-version", "bad version"},
      {{"--plugin", "/no/such.so", "list"}, 3, "", "cannot read", "missing plug-in"},
      {{"--host-version", "none", "call", "FakeEchoZUL", "hex:41"}, 0, "A\n", "", "old host"},
      {{"call", "FakeEchoZUL", "hi", "--verbose"}, 0, "hi\n", "called FakeEchoZUL", "option last"},
      {{"call", "--verbose", "FakeEchoZUL", "hi"}, 0, "hi\n", "called", "option after call"},
      {{"list", "--host-version", "none"},
       0,
       "FakeEchoZUL(s as string) as string\n",
       "",
       "option after list"},
      {{"call", "FakeEchoZUL", "--", "--verbose"}, 0, "--verbose\n", "", "-- ends the options"},
      {{"call", "FakeEchoZUL", "hex:"}, 0, "\n", "", "no hex digits: the empty string"},
      {{"call", "FakeEchoZUL", "hi", "--plugin"}, 2, "", "incomplete option", "no value"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    const ZulRun run = zul(row.args);
    EXPECT_EQ(run.status, row.want_status) << run.err;
    if (row.want_status == 3 || (row.want_status == 0 && row.args[0] != "list")) {
      EXPECT_EQ(run.out, row.want_out);
    } else if (row.want_status == 0) {
      EXPECT_EQ(run.out.substr(0, run.out.find('\n') + 1), row.want_out);
    }
    EXPECT_NE(run.err.find(row.want_err_part), std::string::npos) << run.err;
  }
  const ZulRun list = zul({"list"});
  EXPECT_EQ(list.out.substr(0, list.out.find('\n')), "FakeEchoZUL(s as string) as string");
}

// Command lines that used to end the process (an uncaught stream exception
// for a directory, a segmentation fault for a ptr size beyond its bytes) or
// to blame the overloads: each gives status 2 and names the argument.
TEST(run_zul, bad_command_lines_are_reported_never_crash) {
  const std::string dir = ::testing::TempDir();
  struct {
    std::vector<std::string> args;
    std::string want_err_part;
    const char* why;
  } rows[] = {
      {{"call", "EncodingToHexZUL", "file:" + dir}, "1 (file:" + dir + "): is a directory", "dir"},
      {{"call", "EncodingToHexZUL", "file:" + dir + "/zul-none"}, "no such file", "missing file"},
      {{"call", "EncodingToHexZUL", "file:/dev/null"}, "not a regular file", "a device"},
      {{"call", "CheckUTF8ZUL", "hex:41", "100000000", "?"},
       "argument 2 (size): 100000000 is more than the 1 byte that argument 1 (data) holds",
       "ptr size beyond the bytes given"},
      {{"call", "GetStringsFromDataZUL", "hex:4142", "3", "0"},
       "more than the 2 bytes",
       "one past"},
      {{"call", "EncodingToHexZUL", "hex:4G"}, "'G' at position 2 of the digits is not", "not hex"},
      {{"call", "EncodingToHexZUL", "hex:414"}, "an odd number of hex digits (3)", "odd digits"},
      {{"call", "StringXORZUL", "a", "b", "x"},
       "argument 3 (MaskOffset): 'x' is not",
       "no integer"},
      {{"call", "InStrBytesZUL", "a"}, "argument 2 (find) is missing", "too few arguments"},
      {{"call", "InStrBytesZUL", "a", "b", "c"}, "takes 2 arguments, given 3", "too many"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    std::ostringstream out, err;
    EXPECT_EQ(run_zul(row.args, ZUL_PLUGIN_PATH, out, err), 2);
    EXPECT_NE(err.str().find(row.want_err_part), std::string::npos) << err.str();
    EXPECT_EQ(out.str(), "");
  }
  std::ostringstream out, err;
  EXPECT_EQ(run_zul({"call", "CheckUTF8ZUL", "hex:41FF", "2", "?"}, ZUL_PLUGIN_PATH, out, err), 0)
      << err.str();
  EXPECT_EQ(out.str(), "A?\n");
}

// zul bench: one JSON object a line with the named keys, the text form
// with its figures, and the statuses of a raising call and bad options.
TEST(run_zul, bench_prints_figures_and_host_conversions) {
  const ZulRun json = zul({"bench", "--seconds", "0.02", "--json", "FakeEchoZUL", "hello"});
  ASSERT_EQ(json.status, 0) << json.err;
  EXPECT_EQ(json.out.find("{\"name\":\"FakeEchoZUL\",\"calls\":"), 0u) << json.out;
  for (const char* key : {"\"ns_per_call\":", "\"input_bytes\":5,", "\"gbps\":", "\"memcpy_gbps\":",
                          "\"page_faults_per_call\":", "\"host_conversions\":{"}) {
    EXPECT_NE(json.out.find(key), std::string::npos) << key << " in " << json.out;
  }
  EXPECT_EQ(std::count(json.out.begin(), json.out.end(), '\n'), 1);

  const ZulRun text = zul({"bench", "FakeEchoZUL", "utf16:hi", "--seconds", "0.02"});
  ASSERT_EQ(text.status, 0) << text.err;
  EXPECT_NE(text.out.find("ns per call"), std::string::npos) << text.out;
  EXPECT_NE(text.out.find("memcpy of as many bytes"), std::string::npos) << text.out;
  EXPECT_NE(text.out.find("text conversions by the host per call:"), std::string::npos);

  EXPECT_EQ(zul({"bench", "--seconds", "0.02", "FakeRaiseZUL", "boom"}).status, 1);
  EXPECT_EQ(zul({"bench", "--seconds", "0", "FakeEchoZUL", "x"}).status, 2);
  EXPECT_EQ(zul({"bench", "FakeEchoZUL", "hex:4"}).status, 2);
}

TEST(zul_tool, runs_as_a_program) {
  const std::string command = std::string(ZUL_TOOL_PATH) + " --plugin " + ZUL_FAKE_PLUGIN_PATH +
                              " call FakeEchoZUL 'two words' 2>/dev/null";
  FILE* pipe = popen(command.c_str(), "r");
  ASSERT_NE(pipe, nullptr);
  char buffer[64] = {};
  const std::size_t n = fread(buffer, 1, sizeof buffer - 1, pipe);
  const int status = pclose(pipe);
  EXPECT_EQ(std::string(buffer, n), "two words\n");
  EXPECT_EQ(WEXITSTATUS(status), 0);
  FILE* bad = popen((std::string(ZUL_TOOL_PATH) + " call 2>/dev/null").c_str(), "r");
  ASSERT_NE(bad, nullptr);
  EXPECT_EQ(WEXITSTATUS(pclose(bad)), 2);
}

}  // namespace
