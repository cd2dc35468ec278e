// Every byte-set kernel the machine runs against a plain model: a list of
// member bytes searched one target byte at a time.
#include "common/byte_set.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <vector>

#include "tests/sweep.h"

namespace zul::simd {
namespace {

using testing_sweep::for_each_kernel;
const auto& kTables = detail::byte_set_tables();

std::size_t model(const std::vector<std::uint8_t>& members, const std::uint8_t* p, std::size_t n) {
  for (std::size_t i = 0; i < n; ++i) {
    if (std::find(members.begin(), members.end(), p[i]) != members.end()) return i;
  }
  return n;
}

TEST(byte_set, membership_of_all_256_values) {
  for (int member = 0; member < 256; ++member) {
    const std::uint8_t b = static_cast<std::uint8_t>(member);
    const byte_set set = make_byte_set({&b, 1});
    for (int v = 0; v < 256; ++v)
      EXPECT_EQ(set.contains(static_cast<std::uint8_t>(v)), v == member);
  }
  byte_set range;
  range.add_range(0x30, 0x39);
  range.add_range(9, 3);  // empty
  for (int v = 0; v < 256; ++v)
    EXPECT_EQ(range.contains(static_cast<std::uint8_t>(v)), v >= 0x30 && v <= 0x39);
}

// Each single-byte set over a buffer holding all 256 values, twice, in a
// rotated order so each value sits at several block positions.
TEST(find_first_in_set, every_single_byte_set) {
  std::vector<std::uint8_t> buf(512);
  for (std::size_t i = 0; i < buf.size(); ++i) buf[i] = static_cast<std::uint8_t>(i * 7 + 3);
  for_each_kernel(kTables, [&](const auto& k) {
    for (int member = 0; member < 256; ++member) {
      const std::vector<std::uint8_t> members{static_cast<std::uint8_t>(member)};
      const byte_set set = make_byte_set(members);
      for (std::size_t from : {0u, 1u, 63u, 200u}) {
        ASSERT_EQ(k.find_first(set, buf.data() + from, buf.size() - from),
                  model(members, buf.data() + from, buf.size() - from))
            << member << " from " << from;
      }
    }
  });
}

// Lengths 0..3 vector widths (192 bytes covers AVX-512's two-vector rounds)
// at every misalignment, with one hit placed at every position or none.
TEST(find_first_in_set, length_and_alignment_sweep) {
  const std::vector<std::vector<std::uint8_t>> sets = {
      {0x00},
      {'<', '>', '&', '"'},
      {0x7F, 0x80},
      {0xFF, 0x0F, 0xF0, 0x10, 0x8F, 0x70},
      // Eight ranges, the most the range compares take, with both ends.
      {0x00, 0x01, 0x10, 0x33, 0x30, 0x31, 0x32, 0x7F, 0x80, 0xA0, 0xC0, 0xE0, 0xFF, 0xFE},
      [] {
        std::vector<std::uint8_t> all;
        for (int b = 0x20; b < 0xC0; b += 3) all.push_back(static_cast<std::uint8_t>(b));
        return all;
      }()};
  std::vector<std::uint8_t> buf(192 + 64 + 64);
  for_each_kernel(kTables, [&](const auto& k) {
    for (const auto& members : sets) {
      const byte_set set = make_byte_set(members);
      // Filler: a byte outside the set.
      std::uint8_t filler = 0;
      while (std::find(members.begin(), members.end(), filler) != members.end()) ++filler;
      for (std::size_t align = 0; align < 64; ++align) {
        for (std::size_t n = 0; n <= 192; ++n) {
          std::fill(buf.begin(), buf.end(), filler);
          // A member just past the end must not be found.
          buf[align + n] = members.back();
          std::uint8_t* p = buf.data() + align;
          ASSERT_EQ(k.find_first(set, p, n), n) << "n " << n << " align " << align;
          for (std::size_t hit = 0; hit < n; hit += (n > 40 ? 7 : 1)) {
            p[hit] = members[hit % members.size()];
            ASSERT_EQ(k.find_first(set, p, n), hit) << "n " << n << " align " << align;
            if (hit + 1 < n) p[n - 1] = members[0];  // a later hit changes nothing
            ASSERT_EQ(k.find_first(set, p, n), hit);
            p[hit] = filler;
            p[n - 1] = filler;
          }
        }
      }
    }
  });
}

TEST(find_first_in_set, random_sets_and_buffers_agree_with_the_model) {
  std::mt19937 rng(12);
  for (int round = 0; round < 300; ++round) {
    std::vector<std::uint8_t> members(rng() % 40);
    for (auto& b : members) b = static_cast<std::uint8_t>(rng());
    std::vector<std::uint8_t> buf(rng() % 3000);
    for (auto& b : buf) b = static_cast<std::uint8_t>(rng());
    const byte_set set = make_byte_set(members);
    const std::size_t want = model(members, buf.data(), buf.size());
    EXPECT_EQ(find_first_in_set(set, buf), want);
    for_each_kernel(kTables, [&](const auto& k) {
      ASSERT_EQ(k.find_first(set, buf.data(), buf.size()), want);
    });
  }
}

// Sets built from ranges and single bytes in random order: every kernel
// finds what the membership bits say, whatever ranges the set kept.
TEST(find_first_in_set, sets_of_ranges_agree_with_membership) {
  std::mt19937 rng(5);
  std::vector<std::uint8_t> buf(700);
  for (int round = 0; round < 400; ++round) {
    byte_set set;
    for (unsigned parts = rng() % 12; parts-- > 0;) {
      const auto a = static_cast<std::uint8_t>(rng()), b = static_cast<std::uint8_t>(rng() % 8);
      if (rng() % 2) {
        set.add_range(a, static_cast<std::uint8_t>(a + b < 256 ? a + b : 255));
      } else {
        set.add(a);
      }
    }
    for (auto& c : buf) c = static_cast<std::uint8_t>(rng());
    const std::size_t n = rng() % buf.size();
    const std::size_t want = detail::find_first_in_set_scalar(set, buf.data(), n);
    for_each_kernel(kTables, [&](const auto& k) {
      ASSERT_EQ(k.find_first(set, buf.data(), n), want) << "round " << round;
    });
  }
}

TEST(find_first_in_set, empty_range_and_null_pointer) {
  const byte_set set = make_byte_set(bytes_of("ab"));
  for_each_kernel(kTables, [&](const auto& k) { EXPECT_EQ(k.find_first(set, nullptr, 0), 0u); });
}

// Code-point lanes: every byte value and the saturating values above it, at
// every position of every length up to two AVX-512 blocks past a whole one,
// through both code-point kernels; the narrowed bytes before the hit too.
TEST(find_first_code_point, lanes_saturate_at_255_on_every_kernel) {
  const std::vector<std::uint32_t> values = [] {
    std::vector<std::uint32_t> v;
    for (std::uint32_t c = 0; c < 256; ++c) v.push_back(c);
    for (std::uint32_t c : {0x100u, 0x7FFFu, 0x8000u, 0xFFFFu, 0x10000u, 0x10FFFFu, 0x7FFFFFFFu,
                            0x80000000u, 0xFFFFFFFFu})
      v.push_back(c);
    return v;
  }();
  byte_set markup = make_byte_set(bytes_of("&<>\"'\x01"));
  byte_set high = markup;
  high.add_range(0x80, 0xFF);
  for_each_kernel(kTables, [&](const auto& k) {
    for (const byte_set* set : {&markup, &high}) {
      for (std::size_t n = 0; n <= 144; ++n) {
        std::vector<std::uint32_t> lanes(n + 1, 'a');
        lanes[n] = '&';  // a member just past the end must not be found
        std::vector<std::uint8_t> out(n + 64);
        for (std::size_t hit = 0; hit <= n; hit += (n > 72 ? 5 : 1)) {
          for (std::size_t v = 0; v < values.size(); v += (hit == n / 2 ? 1 : 37)) {
            if (hit < n) lanes[hit] = values[v];
            const std::uint32_t c = hit < n ? values[v] : 0;
            const bool member =
                hit < n && set->contains(static_cast<std::uint8_t>(std::min(c, 255u)));
            const std::size_t want = member ? hit : n;
            ASSERT_EQ(k.find_first_code_point(*set, lanes.data(), n), want)
                << "n " << n << " hit " << hit << " value " << c;
            ASSERT_EQ(k.narrow_until_member(*set, lanes.data(), n, out.data()), want);
            for (std::size_t i = 0; i < want; ++i) {
              ASSERT_EQ(out[i], std::min<std::uint32_t>(lanes[i], 255)) << "n " << n << " i " << i;
            }
          }
          if (hit < n) lanes[hit] = 'a';
        }
      }
    }
  });
}

}  // namespace
}  // namespace zul::simd
