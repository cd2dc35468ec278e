// Single-byte character sets: the reverse map against a plain table search
// for every UTF-16 unit, the fast encoder against the unit-by-unit one on
// random texts at every offset, and every byte through the decoder. The
// conversions' examples run end to end in tests/text_e2e_test.cpp.
#include "text/latin1.h"

#include <gtest/gtest.h>

#include <cstring>
#include <random>
#include <string>
#include <vector>

#include "common/bytes.h"
#include "tests/reference/latin1_reference.h"

namespace {

using namespace zul::text;

std::string bytes_of(const owned_handle& h) {
  if (!h) return {};
  handle_lock lock(h.get());
  return std::string(reinterpret_cast<const char*>(lock.data()), h.size());
}

std::u16string units_of(const owned_handle& h) {
  std::u16string units(h.size() / 2, u'\0');
  if (h) {
    handle_lock lock(h.get());
    std::memcpy(units.data(), lock.data(), units.size() * 2);
  }
  return units;
}

std::span<const std::uint16_t> span_of(std::u16string_view s) {
  return {reinterpret_cast<const std::uint16_t*>(s.data()), s.size()};
}

struct named_kernels {
  const single_byte_kernels* kernels;
  const char* name;
};

// Every level the machine has and, where AVX-512 has VBMI2, also the
// AVX-512 kernels without it (the fallback of machines that lack it).
std::vector<named_kernels> every_kernel() {
  std::vector<named_kernels> all;
  for (const zul::simd::isa level : zul::simd::supported_isas()) {
    all.push_back(
        {&zul::simd::kernels_for(single_byte_tables(), level), zul::simd::isa_name(level)});
  }
#if defined(__x86_64__)
  if (zul::simd::has_avx512_vbmi2()) all.push_back({&detail::kSingleByteAvx512, "avx512 no vbmi2"});
#endif
  return all;
}

struct named_set {
  const single_byte_charset& set;
  const charset_table& table;
  const char* name;
};
const named_set kSets[] = {{kISO8859_1, escapecharsISO8859, "ISO 8859-1"},
                           {kWindows1252, escapecharsCP1252, "Windows-1252"}};

TEST(byte_for_unit, agrees_with_the_table_search_for_every_unit) {
  for (const auto& s : kSets) {
    SCOPED_TRACE(s.name);
    for (std::uint32_t unit = 0; unit <= 0xFFFF; ++unit) {
      const auto u = static_cast<std::uint16_t>(unit);
      ASSERT_EQ(byte_for_unit(s.set, u), zul::reference::search_table_reference(s.table, u))
          << unit;
    }
  }
}

TEST(encode_single_byte, fast_path_matches_reference_on_random_texts) {
  // Mostly ASCII with Latin-1, C1, Windows-1252 punctuation, Greek and
  // surrogate halves mixed in, so that word runs start and stop anywhere.
  const std::uint16_t pool[] = {'a',  'Z',  '0',    ' ',    0x00,   0x7F,   0x80,   0x81,   0x9F,
                                0xE9, 0xFF, 0x20AC, 0x2122, 0x0178, 0x03B1, 0xD83D, 0xDE00, 0xFFFF};
  std::mt19937 random(1);
  std::vector<std::uint16_t> text(80);
  for (int round = 0; round < 3000; ++round) {
    const bool ascii_heavy = round % 2 == 0;
    for (auto& unit : text) {
      // every fourth round only units from 0x100 up: whole blocks dropped
      unit = (ascii_heavy && random() % 8 != 0) ? static_cast<std::uint16_t>(0x20 + random() % 0x5F)
             : round % 4 == 3                   ? pool[11 + random() % 7]
                                                : pool[random() % std::size(pool)];
    }
    const std::size_t offset = random() % 4, length = random() % 76;
    const std::span<const std::uint16_t> units(text.data() + offset, length);
    for (const auto& s : kSets) {
      const std::string want = zul::reference::encode_single_byte_reference(units, s.table);
      for (const auto& [k, name] : every_kernel()) {
        ASSERT_EQ(bytes_of(encode_single_byte(units, s.set, kHandleLimit, *k)), want)
            << s.name << " " << name << " round " << round;
      }
    }
  }
}
// Every unit that needs the table (kept, mapped or dropped) at every
// position of every length up to two blocks of the widest kernel and a tail, in
// text that is otherwise plain Latin-1, on every kernel level.
TEST(encode_single_byte, special_unit_at_every_position_on_every_kernel) {
  const std::uint16_t specials[] = {0x80, 0x81, 0x9F, 0xA0, 0x100, 0x20AC, 0x2122, 0xD800, 0xFFFF};
  for (std::size_t length = 1; length <= 2 * 64 + 1; ++length) {
    std::vector<std::uint16_t> text(length);
    for (std::size_t k = 0; k < length; ++k)
      text[k] = static_cast<std::uint16_t>("ab\xE9 Z"[k % 5] & 0xFF);
    for (std::size_t at = 0; at < length; ++at) {
      for (const std::uint16_t special : specials) {
        std::vector<std::uint16_t> in = text;
        in[at] = special;
        // and, at every third position, with a second one in the same block
        // or the next (patched in place, or dropped after the first was
        // patched)
        std::vector<std::uint16_t> pair = in;
        pair[(at + 7) % length] = 0x2122;
        for (const auto& s : kSets) {
          const std::string want = zul::reference::encode_single_byte_reference(in, s.table);
          const bool with_pair = at % 3 == 0;
          const std::string want_pair =
              with_pair ? zul::reference::encode_single_byte_reference(pair, s.table) : "";
          for (const auto& [k, name] : every_kernel()) {
            ASSERT_EQ(bytes_of(encode_single_byte(in, s.set, kHandleLimit, *k)), want)
                << s.name << " " << name << " length " << length << " at " << at << " unit "
                << special;
            if (!with_pair) continue;
            ASSERT_EQ(bytes_of(encode_single_byte(pair, s.set, kHandleLimit, *k)), want_pair)
                << s.name << " " << name << " pair at " << at;
          }
        }
      }
    }
  }
}

// Every byte value at every lane of lengths up to three blocks.
TEST(decode_single_byte, every_byte_at_every_position_on_every_kernel) {
  for (std::size_t length = 1; length <= 3 * 64 + 1; length += 7) {
    for (int value = 0; value < 256; ++value) {
      std::string in(length, 'q');
      for (std::size_t k = value % 3; k < length; k += 3) in[k] = static_cast<char>(value);
      for (const auto& s : kSets) {
        for (const auto& [k, name] : every_kernel()) {
          const std::u16string units =
              units_of(decode_single_byte(zul::bytes_of(in), s.set, kHandleLimit, *k));
          ASSERT_EQ(units.size(), length);
          for (std::size_t k = 0; k < length; ++k) {
            ASSERT_EQ(units[k], s.table[static_cast<std::uint8_t>(in[k])])
                << s.name << " " << name << " value " << value;
          }
        }
      }
    }
  }
}

TEST(single_byte, handle_beyond_the_limit_gives_null) {
  EXPECT_FALSE(decode_single_byte(zul::bytes_of("abc"), kISO8859_1, 5));
  EXPECT_EQ(bytes_of(decode_single_byte(zul::bytes_of("abc"), kISO8859_1, 6)).size(), 6u);
  EXPECT_FALSE(encode_single_byte(span_of(u"abc"), kISO8859_1, 2));
  EXPECT_EQ(bytes_of(encode_single_byte(span_of(u"abc"), kISO8859_1, 3)), "abc");
}

}  // namespace
