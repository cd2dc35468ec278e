// Inputs for comparing a worker's vector paths with its reference: plain
// filler of every length up to a few vector widths with one special byte at
// every position, and the same length made only of that byte, so that each
// kernel meets the byte in every lane, at block edges and in the tail.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace zul::testing_sweep {

// Calls check(input) for each input.
template <class Check>
void special_byte_sweep(std::string_view specials, std::size_t max_length, Check check) {
  static constexpr std::string_view kFiller = "Plain text, made of words 0123456789 and more";
  for (std::size_t length = 0; length <= max_length; ++length) {
    std::string base(length, ' ');
    for (std::size_t k = 0; k < length; ++k) base[k] = kFiller[k % kFiller.size()];
    check(base);
    for (const char special : specials) {
      check(std::string(length, special));
      for (std::size_t at = 0; at < length; ++at) {
        std::string in = base;
        in[at] = special;
        check(in);
      }
    }
  }
}

// Every byte value, each between two plain letters.
inline std::string every_byte_value() {
  std::string s;
  for (int b = 0; b < 256; ++b) s += std::string("a") + static_cast<char>(b) + "b";
  return s;
}

}  // namespace zul::testing_sweep
