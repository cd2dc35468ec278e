// Large integers in base 10^9: the powers 2^(32q), q = 0 to 30 (up to 2^960,
// 33 limbs), are built at compile time into one table of 32-bit limbs,
// lowest limb first; m * 2^r (r below 32) takes at most three limbs. The
// product's column sums stay below 3 * 10^18 plus the carry, inside 64 bits.
#include "text/integer_digits.h"

#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>

namespace zul::text::detail {
namespace {

constexpr std::uint32_t kBase = 1000000000;
constexpr int kPowers = 31;  // 2^(32 * 30) = 2^960 is the largest step of a double

// Row q holds the limbs of 2^(32q) from start[q] to start[q + 1] - 2; two
// zero limbs lie before each row and after the last, so a product reads
// two limbs past either end of a row without bounds checks.
struct power_table {
  std::array<std::uint32_t, 660> limbs{};
  std::array<std::uint16_t, kPowers + 1> start{};
};

constexpr power_table make_powers() {
  power_table t;
  std::array<std::uint32_t, 40> x{1};  // the current power
  std::size_t n = 1;
  std::size_t at = 2;
  for (int q = 0; q < kPowers; ++q) {
    t.start[q] = static_cast<std::uint16_t>(at);
    for (std::size_t k = 0; k < n; ++k) t.limbs[at++] = x[k];
    at += 2;
    std::uint64_t carry = 0;  // times 2^32
    for (std::size_t k = 0; k < n; ++k) {
      const std::uint64_t v = (std::uint64_t{x[k]} << 32) + carry;
      x[k] = static_cast<std::uint32_t>(v % kBase);
      carry = v / kBase;
    }
    while (carry != 0) {
      x[n++] = static_cast<std::uint32_t>(carry % kBase);
      carry /= kBase;
    }
  }
  t.start[kPowers] = static_cast<std::uint16_t>(at);
  return t;
}

constexpr power_table kPowersOf2 = make_powers();

constexpr std::array<char, 200> make_pairs() {
  std::array<char, 200> p{};
  for (int i = 0; i < 100; ++i) {
    p[2 * i] = static_cast<char>('0' + i / 10);
    p[2 * i + 1] = static_cast<char>('0' + i % 10);
  }
  return p;
}
constexpr std::array<char, 200> kPairs = make_pairs();

void put_four(char* p, std::uint32_t v) {
  std::memcpy(p, &kPairs[2 * (v / 100)], 2);
  std::memcpy(p + 2, &kPairs[2 * (v % 100)], 2);
}

// Nine digits of v (below 10^9), leading zeros included.
void put_nine(char* p, std::uint32_t v) {
  const std::uint32_t top = v / 100000000;
  v -= top * 100000000;
  p[0] = static_cast<char>('0' + top);
  put_four(p + 1, v / 10000);
  put_four(p + 5, v % 10000);
}

// v (not 0) without leading zeros.
char* put_leading(char* p, std::uint32_t v) {
  char nine[9];
  put_nine(nine, v);
  int first = 0;
  while (nine[first] == '0') ++first;
  std::memcpy(p, nine + first, static_cast<std::size_t>(9 - first));
  return p + (9 - first);
}

}  // namespace

char* put_large_integer(char* p, double whole) noexcept {
  const auto bits = std::bit_cast<std::uint64_t>(whole);
  const std::uint64_t m = (bits & ((std::uint64_t{1} << 52) - 1)) | (std::uint64_t{1} << 52);
  const int e = static_cast<int>((bits >> 52) & 0x7FF) - 1075;  // 12 to 971
  const int r = e & 31;
  const int q = e >> 5;

  // m * 2^r in base 10^9: m has at most two limbs (m < 9.1 * 10^15).
  std::uint64_t a[3];
  const std::uint64_t low = (m % kBase) << r;  // below 2^61
  const std::uint64_t middle = ((m / kBase) << r) + low / kBase;
  a[0] = low % kBase;
  a[1] = middle % kBase;
  a[2] = middle / kBase;

  const std::uint32_t* t = kPowersOf2.limbs.data() + kPowersOf2.start[q];
  const std::ptrdiff_t n = kPowersOf2.start[q + 1] - kPowersOf2.start[q] - 2;

  // The product fits n + 3 limbs. Column sums (below 3 * 10^18), each split into a limb and a part
  // for the next column, twice, independently of each other: the parts left are at most 4, so a
  // carry out of a column is rare and goes last.
  std::uint32_t product[40];
  std::uint64_t high = 0;
  for (std::ptrdiff_t k = 0; k < n + 2; ++k) {
    const std::uint64_t sum = a[0] * t[k] + a[1] * t[k - 1] + a[2] * t[k - 2];
    product[k] = static_cast<std::uint32_t>(sum % kBase);
    const std::uint64_t next = sum / kBase;
    product[k] += static_cast<std::uint32_t>(high);  // below 2^32: 10^9 + 3 * 10^9
    high = next;
  }
  product[n + 2] = static_cast<std::uint32_t>(high);
  std::uint32_t over = 0;
  bool spill = false;
  for (std::ptrdiff_t k = 0; k < n + 3; ++k) {
    const std::uint32_t v = product[k] % kBase + over;
    over = product[k] / kBase;
    product[k] = v;
    spill |= v >= kBase;
  }
  if (spill) {
    std::uint32_t c = 0;
    for (std::ptrdiff_t k = 0; k < n + 3; ++k) {
      product[k] += c;
      c = product[k] >= kBase ? 1 : 0;
      product[k] -= c * kBase;
    }
  }
  std::ptrdiff_t top = n + 2;
  while (product[top] == 0) --top;
  p = put_leading(p, product[top]);
  for (std::ptrdiff_t k = top - 1; k >= 0; --k, p += 9) put_nine(p, product[k]);
  return p;
}

}  // namespace zul::text::detail
