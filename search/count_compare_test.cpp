// Counting and byte ordering: the memchr / memcmp versions against the plain
// scans on random strings over tiny alphabets, so that matches, near-matches
// and zero tails are frequent. The rules themselves are tabled end to end.
#include "search/count_compare.h"

#include <gtest/gtest.h>

#include <random>
#include <string>

#include "tests/reference/count_compare_reference.h"

namespace zul::search {
namespace {

bytes_view b(const std::string& s) {
  return {reinterpret_cast<const std::uint8_t*>(s.data()), s.size()};
}

std::string random_string(std::mt19937& rng, std::size_t max_len, std::string_view alphabet) {
  std::string s(rng() % (max_len + 1), 'a');
  for (char& c : s) c = alphabet[rng() % alphabet.size()];
  return s;
}

TEST(count_occurrences, agrees_with_reference_on_random_strings) {
  std::mt19937 rng(5);
  for (int round = 0; round < 4000; ++round) {
    const std::string s = random_string(rng, 40, round % 2 ? "ab" : std::string_view("ab\0c", 4));
    const std::string find = random_string(rng, 4, "ab");
    ASSERT_EQ(count_occurrences(b(s), b(find)),
              zul::reference::count_occurrences_reference(b(s), b(find)))
        << s << "/" << find;
  }
}

TEST(compare_bytes, agrees_with_reference_and_is_antisymmetric) {
  std::mt19937 rng(7);
  for (int round = 0; round < 4000; ++round) {
    const std::string x = random_string(rng, 6, std::string_view("\0\0a\xFF", 4));
    const std::string y = random_string(rng, 6, std::string_view("\0\0a\xFF", 4));
    ASSERT_EQ(compare_bytes(b(x), b(y)), zul::reference::compare_bytes_reference(b(x), b(y)));
    ASSERT_EQ(compare_bytes(b(x), b(y)), -compare_bytes(b(y), b(x)));
  }
}

}  // namespace
}  // namespace zul::search
