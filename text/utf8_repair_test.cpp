// UTF-8 repair: the well-formedness table at each of its boundaries, cut
// sequences, every (first, second) byte pair against a decoding model, and
// the block-kernel repair against the per-position reference on every kernel
// level: random sequences, a faulty byte at every position of lengths across
// three blocks, random bytes, and (when ZUL_TESTDATA names the folder of
// public test data) the UTF-8 stress test and its verdicts.
#include "text/utf8_repair.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdlib>
#include <fstream>
#include <random>
#include <sstream>
#include <string>
#include <string_view>

#include "common/bytes.h"
#include "tests/reference/utf8_repair_reference.h"
#include "tests/sweep.h"

namespace zul::text {
namespace {

using namespace std::string_view_literals;

const simd::utf8_kernels& kernels(simd::isa level) {
  return simd::kernels_for(simd::utf8_tables(), level);
}

// Every kernel level repairs in as the reference does.
void expect_all_levels_match(std::string_view in, std::string_view placeholder) {
  const std::string want = reference::repair_utf8_reference(bytes_of(in), placeholder);
  for (const simd::isa level : simd::supported_isas()) {
    ASSERT_EQ(repair_utf8(bytes_of(in), placeholder, kMaxResultBytes, kernels(level)).view(), want)
        << simd::isa_name(level);
  }
}

TEST(repair_utf8, table_boundaries) {
  struct {
    std::string_view in, want;
    const char* why;
  } rows[] = {
      {"caf\xE9", "caf?", "Latin-1 byte"},
      {std::string_view("a\0\x7F", 3), std::string_view("a\0\x7F", 3), "zero byte and 7F pass"},
      {"\xC2\x80\xDF\xBF\xC0\x80\xC1\xBF", "\xC2\x80\xDF\xBF????", "C2..DF; C0, C1 overlong"},
      {"\xE0\xA0\x80\xE0\x9F\xBF", "\xE0\xA0\x80???", "E0 needs A0..BF"},
      {"\xED\x9F\xBF\xED\xA0\x80", "\xED\x9F\xBF???", "ED stops before the surrogates"},
      {"\xEF\xBF\xBF\xE1\x80\x7F", "\xEF\xBF\xBF??\x7F", "third byte below 80"},
      {"\xF0\x90\x80\x80\xF0\x8F\xBF\xBF", "\xF0\x90\x80\x80????", "F0 needs 90..BF"},
      {"\xF4\x8F\xBF\xBF\xF4\x90\x80\x80", "\xF4\x8F\xBF\xBF????", "U+10FFFF, then above it"},
      {"\xF3\xBF\xBF\xC0\xF5\xFF\x80", "???????", "fourth byte above BF; F5..FF, lone 80"},
      {"\xE2\x82"
       "A\xE2\xE2\x82\xAC",
       "??A?\xE2\x82\xAC", "one placeholder per byte, next judged afresh"},
      {"x\xC3", "x?", "cut by the end after one byte"},
      {"x\xE2\x82", "x??", "cut after two bytes"},
      {"x\xF0\x9F\x98", "x???", "cut after three bytes"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    EXPECT_EQ(reference::repair_utf8_reference(bytes_of(row.in), "?"), row.want);
    for (const simd::isa level : simd::supported_isas()) {
      SCOPED_TRACE(simd::isa_name(level));
      // Padded past a block so that the vector kernels judge the row too.
      const std::string pad(70, 'x');
      const std::string in = pad + std::string(row.in) + pad;
      EXPECT_EQ(repair_utf8(bytes_of(in), "?", kMaxResultBytes, kernels(level)).view(),
                pad + std::string(row.want) + pad);
      EXPECT_EQ(repair_utf8(bytes_of(row.in), "?", kMaxResultBytes, kernels(level)).view(),
                row.want);
      // Ending at a block edge, before blocks of ASCII that a kernel may
      // skip: 64 for the x86 kernels, 80 for the NEON kernel's runs of four
      // 16-byte blocks after the first.
      for (const std::size_t edge : {64, 80}) {
        const std::string head(edge - row.in.size(), 'x'), tail(192, 'x');
        EXPECT_EQ(repair_utf8(bytes_of(head + std::string(row.in) + tail), "?", kMaxResultBytes,
                              kernels(level))
                      .view(),
                  head + std::string(row.want) + tail)
            << "edge " << edge;
      }
    }
  }
}

TEST(well_formed_length, every_first_and_second_byte_against_model) {
  for (int first = 0; first < 256; ++first) {
    for (int second = 0; second < 256; ++second) {
      for (std::size_t n = 1; n <= 4; ++n) {
        const std::uint8_t s[4] = {static_cast<std::uint8_t>(first),
                                   static_cast<std::uint8_t>(second), 0x80, 0xBF};
        ASSERT_EQ(reference::well_formed_length_reference({s, n}),
                  testing_sweep::utf8_model_length({s, n}))
            << first << " " << second << " " << n;
      }
    }
  }
}

TEST(repair_utf8, prefix_skip_matches_reference_on_random_data) {
  std::mt19937 rng(3);
  const std::string_view pieces[] = {"a",
                                     "bcdefgh",
                                     "\xC3\xA9",
                                     "\xE2\x82\xAC",
                                     "\xF0\x9F\x98\x80",
                                     "\xED\xA0\x80",
                                     "\xC0",
                                     "\x80",
                                     "\xF4\x90",
                                     "\xE2\x82",
                                     "\xFF",
                                     "\0"sv};
  for (int round = 0; round < 5000; ++round) {
    std::string in;
    const std::size_t parts = rng() % 24;
    for (std::size_t k = 0; k < parts; ++k) in += pieces[rng() % (k % 3 ? 2 : std::size(pieces))];
    SCOPED_TRACE(round);
    expect_all_levels_match(in, "<?>");
    const std::size_t prefix = well_formed_prefix(bytes_of(in));
    ASSERT_TRUE(prefix == in.size() ||
                reference::well_formed_length_reference(bytes_of(in).subspan(prefix)) == 0);
  }
}

// Text of 1..4-byte characters cut at every length up to three AVX-512
// blocks, with one faulty byte (or a cut sequence) at every position, so
// each kernel meets the fault in every lane and across block edges.
TEST(repair_utf8, fault_at_every_position_of_every_length) {
  const std::string_view chars[] = {"a", "\xC3\xA9", "\xE2\x82\xAC", "\xF0\x9F\x98\x80"};
  std::string text;
  for (int k = 0; text.size() < 200; ++k) text += chars[(k * 7 + k / 3) % 4];
  const std::string_view faults[] = {"\xFF",         "\x80",     "\xC0\x80",
                                     "\xED\xA0\x80", "\xE2\x82", "\xF4\x90"};
  for (std::size_t length = 0; length <= 3 * 64 + 3; ++length) {
    const std::string base = text.substr(0, length);
    expect_all_levels_match(base, "?");
    for (std::size_t at = 0; at <= length; ++at) {
      for (const std::string_view fault : faults) {
        std::string in = base;
        in.insert(at, fault);
        SCOPED_TRACE(testing::Message() << "length " << length << " at " << at);
        expect_all_levels_match(in, "?");
      }
    }
  }
}

TEST(repair_utf8, all_byte_values_and_random_bytes) {
  std::string every;
  for (int c = 0; c < 256; ++c) every += std::string(1, static_cast<char>(c)) + "xy\xC3\xA9";
  expect_all_levels_match(every, "\xEF\xBF\xBD");
  std::mt19937 rng(11);
  for (int round = 0; round < 200; ++round) {
    std::string in(rng() % 600, '\0');
    const unsigned high = rng() % 4;  // mostly ASCII up to all random
    for (char& c : in) c = static_cast<char>(rng() % 4 < high ? rng() : rng() % 0x80);
    SCOPED_TRACE(round);
    expect_all_levels_match(in, std::array{""sv, "<?>"sv, "[bad byte]"sv}[round % 3]);
  }
}

TEST(repair_utf8, grows_past_its_reserve) {
  const std::string in(10000, '\xFF');
  for (const simd::isa level : simd::supported_isas()) {
    EXPECT_EQ(repair_utf8(bytes_of(in), "\xEF\xBF\xBD", kMaxResultBytes, kernels(level)).size(),
              30000u);
  }
}

// The stress test of public test data, whole and line by line, and each
// verdict case as well formed or not. Skipped when ZUL_TESTDATA is unset.
TEST(repair_utf8, public_stress_test) {
  const char* dir = std::getenv("ZUL_TESTDATA");
  if (dir == nullptr) GTEST_SKIP() << "ZUL_TESTDATA not set";
  std::ifstream file(std::string(dir) + "/UTF-8-test.txt", std::ios::binary);
  std::ifstream verdicts(std::string(dir) + "/utf8_kuhn_verdicts.tsv");
  ASSERT_TRUE(file && verdicts);
  std::stringstream all;
  all << file.rdbuf();
  const std::string stress = all.str();
  expect_all_levels_match(stress, "\xEF\xBF\xBD");
  std::istringstream lines(stress);
  for (std::string line; std::getline(lines, line);) expect_all_levels_match(line, "?");
  for (std::string row; std::getline(verdicts, row);) {
    if (row.empty() || row[0] == '#') continue;
    const std::size_t tab = row.find('\t');
    std::string bytes;
    for (std::size_t k = tab + 1; k + 1 < row.size(); k += 2) {
      bytes += static_cast<char>(std::stoi(row.substr(k, 2), nullptr, 16));
    }
    SCOPED_TRACE(row);
    const bool well_formed = row.substr(0, tab) == "true";
    for (const simd::isa level : simd::supported_isas()) {
      const std::string padded = std::string(64, 'x') + bytes + std::string(64, 'x');
      EXPECT_EQ(repair_utf8(bytes_of(padded), "", kMaxResultBytes, kernels(level)).size() ==
                    padded.size(),
                well_formed);
    }
  }
}

}  // namespace
}  // namespace zul::text
