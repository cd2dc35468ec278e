// Edit distance: the bit-vector and row versions, in both argument orders,
// against a full-matrix model on random pairs over tiny alphabets (with
// non-BMP code points) spread over one to five 64-character blocks. The
// worked examples of both distances are tabled end to end.
#include "search/distance.h"

#include <gtest/gtest.h>

#include <random>
#include <vector>

namespace zul::search {
namespace {

using text = std::vector<std::uint32_t>;

// The restricted edit distance exactly as the textbook matrix defines it:
// (lb + 1) rows of (la + 1) cells, all kept.
std::int64_t model_edit_distance(const text& a, const text& b) {
  const std::size_t la = a.size(), lb = b.size();
  std::vector<std::int64_t> d((la + 1) * (lb + 1));
  auto at = [&](std::size_t j, std::size_t i) -> std::int64_t& { return d[j * (la + 1) + i]; };
  for (std::size_t i = 0; i <= la; ++i) at(0, i) = static_cast<std::int64_t>(i);
  for (std::size_t j = 0; j <= lb; ++j) at(j, 0) = static_cast<std::int64_t>(j);
  for (std::size_t i = 1; i <= la; ++i) {
    for (std::size_t j = 1; j <= lb; ++j) {
      const std::int64_t cost = a[i - 1] == b[j - 1] ? 0 : 1;
      std::int64_t v = std::min({at(j - 1, i) + 1, at(j, i - 1) + 1, at(j - 1, i - 1) + cost});
      if (i >= 2 && j >= 2 && a[i - 1] == b[j - 2] && a[i - 2] == b[j - 1])
        v = std::min(v, at(j - 2, i - 2) + cost);
      at(j, i) = v;
    }
  }
  return at(lb, la);
}

text random_text(std::mt19937& rng, std::size_t max_len) {
  static constexpr std::uint32_t kAlphabet[] = {'a', 'b', 'c', 0x1F600, 0xE9, 0x10FFFF};
  text t(rng() % (max_len + 1));
  const std::size_t letters = 2 + rng() % 5;
  for (auto& c : t) c = kAlphabet[rng() % letters];
  return t;
}

TEST(edit_distance, bit_and_row_versions_match_full_matrix_model) {
  std::mt19937 rng(11);
  for (int round = 0; round < 2000; ++round) {
    const text a = random_text(rng, round % 3 == 0 ? 260 : 70);
    text b = a;
    if (round % 2) {
      b = random_text(rng, round % 5 == 1 ? 200 : 70);
    } else {  // a near copy: neighbours swapped, maybe one character dropped
      for (std::size_t k = 0; k + 1 < b.size(); k += 1 + rng() % 5) std::swap(b[k], b[k + 1]);
      if (!b.empty() && rng() % 2) b.erase(b.begin() + static_cast<long>(rng() % b.size()));
    }
    const std::int64_t want = model_edit_distance(a, b);
    ASSERT_EQ(edit_distance(a, b), want) << round;
    ASSERT_EQ(edit_distance(b, a), want) << round;
    ASSERT_EQ(detail::edit_distance_rows(a, b), want) << round;
    if (!a.empty() && !b.empty()) {
      ASSERT_EQ(detail::edit_distance_bits(b, a), want) << round;
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
}

}  // namespace
}  // namespace zul::search
