// Both distances against the references that keep the first definitions
// (tests/reference): every path (one word, blocks, position lists) on random
// pairs over small alphabets, so that matches, swaps and crossed pairs are
// frequent, with code points inside and beyond the byte table, at lengths
// around the 64-character word. Jaro-Winkler must give the same double to
// the last bit. The worked examples are tabled end to end.
#include "search/distance.h"

#include <gtest/gtest.h>

#include <bit>
#include <random>
#include <vector>

#include "search/jaro_kernels.h"
#include "tests/reference/distance_reference.h"

namespace zul::search {
namespace {

using zul::reference::edit_distance_reference;
using zul::reference::jaro_winkler_distance_reference;
using text = std::vector<std::uint32_t>;

// Letters from one of six alphabets: bytes, code points that all share a
// hash slot family, a mix with the largest code points, and runs across
// 0x100 and 0x10000 that the vector kernels tell apart by their low 8 or
// 16 bits alone.
text random_text(std::mt19937& rng, std::size_t len) {
  static constexpr std::uint32_t kMixed[] = {'a', 'b', 'c', 0x1F600, 0xE9, 0x10FFFF, 0x100, 0xFF};
  static constexpr std::uint32_t kFirst[] = {'a', 0x4E00, 0, 0xF0, 0xFFD0, 0xFF00};
  static constexpr std::uint32_t kStep[] = {1, 128, 0, 30, 20, 100};
  text t(len);
  const std::size_t letters = 2 + rng() % 7;
  const std::size_t kind = rng() % 6;
  for (auto& c : t) {
    const std::size_t pick = rng() % letters;
    c = kind == 2 ? kMixed[pick] : kFirst[kind] + static_cast<std::uint32_t>(pick) * kStep[kind];
  }
  return t;
}

// b is either unrelated to a or a near copy (neighbours swapped, a character
// dropped or changed), so both far and close pairs occur.
text partner(std::mt19937& rng, const text& a, std::size_t max_len) {
  if (rng() % 2) return random_text(rng, rng() % (max_len + 1));
  text b = a;
  for (std::size_t k = 0; k + 1 < b.size(); k += 1 + rng() % 5) std::swap(b[k], b[k + 1]);
  if (!b.empty() && rng() % 2) b.erase(b.begin() + static_cast<long>(rng() % b.size()));
  if (!b.empty() && rng() % 2) b[rng() % b.size()] = 'z';
  return b;
}

// Lengths that cross the one-word limit and block edges.
std::size_t random_length(std::mt19937& rng, int round) {
  static constexpr std::size_t kMax[] = {8, 63, 65, 130, 300};
  return rng() % (kMax[round % 5] + 1);
}

TEST(edit_distance, every_path_matches_reference) {
  std::mt19937 rng(11);
  for (int round = 0; round < 4000; ++round) {
    const text a = random_text(rng, random_length(rng, round));
    const text b = partner(rng, a, random_length(rng, round / 5));
    const std::int64_t want = edit_distance_reference(a, b);
    SCOPED_TRACE(testing::Message()
                 << "round " << round << " sizes " << a.size() << ", " << b.size());
    ASSERT_EQ(edit_distance(a, b), want);
    ASSERT_EQ(edit_distance(b, a), want);
    if (a.empty() || b.empty()) continue;
    ASSERT_EQ(detail::edit_distance_blocks(a, b), want);
    if (a.size() <= 64) {
      ASSERT_EQ(detail::edit_distance_word(a, b), want);
    }
  }
}

TEST(edit_distance, long_texts_need_little_memory) {
  // The full matrix of these texts would need 2.4 GB; the carries need 3 KB.
  const text a(100000, 'a');
  text b(3000, 'a');
  b[5] = 'b';
  EXPECT_EQ(edit_distance(a, b), 97001);
  EXPECT_EQ(edit_distance_work_bytes(100000, 3000), 3000);
  EXPECT_EQ(edit_distance_work_bytes(100000, 64), 0);  // one word, nothing allocated
  text c(64, 0x1F600);
  c[63] = 'a';
  EXPECT_EQ(edit_distance(a, c), 100000 - 1);
}

// Bit for bit: the same double, not a near one.
void expect_same(double got, double want) {
  EXPECT_EQ(std::bit_cast<std::uint64_t>(got), std::bit_cast<std::uint64_t>(want))
      << got << " != " << want;
}

TEST(jaro_winkler_distance, every_path_matches_reference_to_the_bit) {
  std::mt19937 rng(5);
  for (int round = 0; round < 6000; ++round) {
    const text a = random_text(rng, random_length(rng, round));
    const text b = partner(rng, a, random_length(rng, round / 5));
    const double want = jaro_winkler_distance_reference(a, b);
    SCOPED_TRACE(testing::Message()
                 << "round " << round << " sizes " << a.size() << ", " << b.size());
    const distance_result got = jaro_winkler_distance(a, b);
    ASSERT_EQ(got.unallocated_bytes, 0);
    expect_same(got.value, want);
    if (a.empty() || b.empty()) continue;
    expect_same(detail::jaro_winkler_lists(a, b).value, want);
    if (b.size() > 64) continue;
    for (const simd::isa level : simd::supported_isas()) {
      SCOPED_TRACE(simd::isa_name(level));
      expect_same(detail::jaro_winkler_word(a, b, kernels_for(detail::jaro_tables(), level)).value,
                  want);
    }
  }
}

TEST(jaro_winkler_distance, many_distinct_wide_characters) {
  // Hundreds of distinct code points above U+00FF fill the hash table of
  // the position lists well beyond the one-word limit.
  std::mt19937 rng(9);
  for (const std::size_t len : {65, 500, 3000}) {
    text a(len), b(len);
    for (auto& c : a) c = 0x3000 + rng() % 700;
    for (auto& c : b) c = 0x3000 + rng() % 700;
    expect_same(jaro_winkler_distance(a, b).value, jaro_winkler_distance_reference(a, b));
    b = a;
    std::swap(b[3], b[len - 2]);
    expect_same(jaro_winkler_distance(a, b).value, jaro_winkler_distance_reference(a, b));
  }
}

TEST(jaro_winkler_distance, edge_shapes_match_reference) {
  const struct {
    text a, b;
    const char* why;
  } rows[] = {
      {{'a'}, {'a'}, "one character each"},
      {{'a', 'b'}, {'b', 'a'}, "window 0: no crossed match"},
      {text(64, 'x'), text(64, 'x'), "a full word"},
      {text(65, 'x'), text(64, 'x'), "a longer than the word"},
      {text(64, 'x'), text(65, 'x'), "b one past the word"},
      {text(1000, 'x'), {'x'}, "a far longer: only its start is in reach"},
      {{'x'}, text(1000, 'x'), "b far longer"},
      {text(200, 'a'), text(200, 'b'), "nothing in common"},
      {{0xFFFFFFFF, 0}, {0, 0xFFFFFFFF}, "extreme code units"},
      {{0, 'a', 0, 0, 'b'}, {'b', 0}, "NUL against a short b: its empty lanes hold 0"},
      {{0x4E00, 0x4E00, 0x4E01}, {0x4E01}, "low byte 0 against the empty lanes of b"},
      {text(128, 'x'), {'x'}, "window 63: the whole word in reach of the first"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    expect_same(jaro_winkler_distance(row.a, row.b).value,
                jaro_winkler_distance_reference(row.a, row.b));
    expect_same(detail::jaro_winkler_lists(row.a, row.b).value,
                jaro_winkler_distance_reference(row.a, row.b));
  }
}

TEST(jaro_winkler_distance, long_pairs_match_reference) {
  std::mt19937 rng(3);
  for (const std::size_t len : {1000, 10000}) {
    text a(len), b(len);
    for (auto& c : a) c = 'a' + rng() % 26;
    for (auto& c : b) c = 'a' + rng() % 26;
    expect_same(jaro_winkler_distance(a, b).value, jaro_winkler_distance_reference(a, b));
  }
}

}  // namespace
}  // namespace zul::search
