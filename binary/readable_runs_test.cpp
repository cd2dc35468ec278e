// Readable runs: the lead-byte table against a model that decodes each
// code point, over every pair of leading bytes and the continuation edges.
#include "binary/readable_runs.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>

#include "common/bytes.h"
#include "common/cpu.h"
#include "tests/sweep.h"

namespace zul::binary {
namespace {

// Length of the readable unit at s[i]: printable ASCII, tab, line feed and
// carriage return, or a well-formed multi-byte character.
std::size_t model_unit(std::string_view s, std::size_t i) {
  const auto b = static_cast<unsigned char>(s[i]);
  if (b < 0x80) return b == 9 || b == 10 || b == 13 || (b >= 0x20 && b <= 0x7E) ? 1 : 0;
  return testing_sweep::utf8_model_length(bytes_of(s.substr(i)));
}

std::size_t model_run(std::string_view s) {
  std::size_t i = 0;
  while (i < s.size()) {
    const std::size_t u = model_unit(s, i);
    if (u == 0) break;
    i += u;
  }
  return i;
}

// Every lead byte with every second byte, then a few third and fourth bytes
// that straddle the continuation range.
TEST(measure_run, agrees_with_decoding_model) {
  const unsigned char tails[] = {0x41, 0x7F, 0x80, 0x8F, 0x90, 0x9F, 0xA0, 0xBF, 0xC0};
  for (int a = 0; a < 256; ++a) {
    for (int b = 0; b < 256; ++b) {
      for (unsigned char c : tails) {
        for (unsigned char d : {0x41, 0x80, 0xC0}) {
          std::string s{static_cast<char>(a), static_cast<char>(b), static_cast<char>(c),
                        static_cast<char>(d)};
          for (std::size_t cut = 1; cut <= 4; cut += 3) {
            const std::string_view v(s.data(), cut);
            ASSERT_EQ(detail::measure_run(bytes_of(v), 0).length, model_run(v))
                << std::hex << a << " " << b << " " << int{c} << " " << int{d} << " cut " << cut;
          }
        }
      }
    }
  }
}

bool model_visible(std::string_view run) {
  for (const char c : run) {
    if (static_cast<unsigned char>(c) > 0x20) return true;
  }
  return false;
}

// Runs long enough for the byte-set searches, with a byte that ends or
// continues them at every position, on every search level.
TEST(measure_run, every_scan_level_with_an_ending_byte_everywhere) {
  const std::string specials("\x00\x1F\x7F\x80\xC3 \n\xFF", 8);
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    testing_sweep::special_byte_sweep(specials, 100, [&](const std::string& in) {
      for (const std::string& s : {in, in + "\xC3\xA9" + in, std::string(70, ' ') + in}) {
        for (std::size_t pos = 0; pos < s.size() && pos < 2; ++pos) {
          const detail::run_measure got = detail::measure_run(bytes_of(s), pos, scan_for(level));
          const std::string_view from = std::string_view(s).substr(pos);
          ASSERT_EQ(got.length, model_run(from));
          ASSERT_EQ(got.visible, model_visible(from.substr(0, got.length)));
        }
      }
    });
  }
}

}  // namespace
}  // namespace zul::binary
