// Exact decimal formatting of doubles. A finite double is m * 2^e with an
// integer m below 2^53; its decimal digits are those of m * 2^e (e >= 0) or
// of m * 5^-e with the point -e places from the right (e < 0), computed in a
// fixed big integer of base-10^9 limbs (at most 767 digits). Rounding to a
// digit position is then exact, half to even.
#include "tests/reference/number_format_reference.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <string_view>

namespace zul::reference {
namespace {

constexpr std::uint32_t kLimbBase = 1000000000;  // 10^9 per limb
constexpr int kMaxLimbs = 90;                    // 810 digits >= 767 needed

// The significant digits of a non-negative double, without leading or
// trailing zeros; the value is 0.digits * 10^point. count 0 means zero.
struct exact_decimal {
  std::array<char, kMaxLimbs * 9> digits;
  int count = 0;
  int point = 0;
};

// A non-negative integer in base-10^9 limbs, least significant first.
struct big_integer {
  std::array<std::uint32_t, kMaxLimbs> limbs;
  int size = 0;

  explicit big_integer(std::uint64_t m) {  // m < 10^18
    limbs[size++] = static_cast<std::uint32_t>(m % kLimbBase);
    if (m >= kLimbBase) limbs[size++] = static_cast<std::uint32_t>(m / kLimbBase);
  }

  void multiply(std::uint64_t factor) {  // factor < 2^32
    std::uint64_t carry = 0;
    for (int i = 0; i < size; ++i) {
      const std::uint64_t v = limbs[i] * factor + carry;  // < 10^9 * 2^32 + 2^32
      limbs[i] = static_cast<std::uint32_t>(v % kLimbBase);
      carry = v / kLimbBase;
    }
    while (carry != 0) {
      limbs[size++] = static_cast<std::uint32_t>(carry % kLimbBase);
      carry /= kLimbBase;
    }
  }

  // The decimal digits, most significant first, without leading zeros.
  int write(char* p) const {
    char* const first = p;
    char top[10];
    int top_len = 0;
    for (std::uint32_t v = limbs[size - 1]; v != 0; v /= 10) {
      top[top_len++] = static_cast<char>('0' + v % 10);
    }
    while (top_len > 0) *p++ = top[--top_len];
    for (int i = size - 2; i >= 0; --i) {
      std::uint32_t v = limbs[i];
      for (int k = 8; k >= 0; --k) {
        p[k] = static_cast<char>('0' + v % 10);
        v /= 10;
      }
      p += 9;
    }
    return static_cast<int>(p - first);
  }
};

// m * 2^e as the fields of a double (subnormals included), with the factors
// of 2 that a negative e would turn into factors of 5 taken out of m.
void unpack(double magnitude, std::uint64_t& m, int& e) {
  const auto bits = std::bit_cast<std::uint64_t>(magnitude);
  const int biased = static_cast<int>((bits >> 52) & 0x7FF);
  m = bits & ((std::uint64_t{1} << 52) - 1);
  e = -1074;  // subnormals and zero
  if (biased != 0) {
    m |= std::uint64_t{1} << 52;
    e = biased - 1075;
  }
  while (m != 0 && (m & 1) == 0 && e < 0) {
    m >>= 1;
    ++e;
  }
}

void expand(double magnitude, exact_decimal& out) {
  std::uint64_t m = 0;
  int e = 0;
  unpack(magnitude, m, e);
  out.count = 0;
  out.point = 0;
  if (m == 0) return;
  big_integer value(m);
  for (int left = e; left > 0; left -= 31) value.multiply(std::uint64_t{1} << std::min(left, 31));
  for (int left = -e; left > 0; left -= 13) {  // 5^13 < 2^32
    std::uint64_t factor = 1;
    for (int i = 0; i < std::min(left, 13); ++i) factor *= 5;
    value.multiply(factor);
  }
  out.count = value.write(out.digits.data());
  out.point = out.count - std::max(-e, 0);
  while (out.count > 0 && out.digits[out.count - 1] == '0') --out.count;
}

// Keeps the first keep significant digits, rounding half to even on the
// exact value. keep may be zero or negative (the value may round to 0).
void round_to(exact_decimal& x, std::int64_t keep) {
  if (x.count == 0 || keep >= x.count) return;
  if (keep < 0) {  // the first dropped digit is a leading 0
    x.count = 0;
    return;
  }
  const int k = static_cast<int>(keep);
  const char next = x.digits[k];
  const bool more = x.count > k + 1;  // non-zero digits after next (none trail)
  const bool odd = k > 0 && ((x.digits[k - 1] - '0') & 1);
  const bool up = next > '5' || (next == '5' && (more || odd));
  x.count = k;
  if (up) {
    int i = k - 1;
    while (i >= 0 && x.digits[i] == '9') --i;
    if (i < 0) {  // 99..9 + 1 = 10..0
      x.digits[0] = '1';
      x.count = 1;
      ++x.point;
      return;
    }
    ++x.digits[i];
    x.count = i + 1;
  }
  while (x.count > 0 && x.digits[x.count - 1] == '0') --x.count;
}

// Appends up to a character limit; later puts are dropped.
struct writer {
  std::string& text;
  std::size_t limit;
  bool room() const { return text.size() < limit; }
  void put(char c) {
    if (room()) text += c;
  }
  void put(std::string_view s) {
    for (const char c : s) put(c);
  }
};

// inf, -inf and nan; false for finite values.
bool put_special(writer& w, double d) {
  if (std::isnan(d)) {
    w.put("nan");  // the sign of a NaN is not shown
  } else if (std::isinf(d)) {
    w.put(d < 0 ? "-inf" : "inf");
  } else {
    return false;
  }
  return true;
}

char digit_at(const exact_decimal& x, std::int64_t index) {
  return (index >= 0 && index < x.count) ? x.digits[static_cast<std::size_t>(index)] : '0';
}

}  // namespace

std::string format_fixed_reference(double d, int precision, std::size_t limit) {
  std::string text;
  writer w{text, std::min<std::size_t>(limit, 499)};
  if (put_special(w, d)) return text;
  exact_decimal x;
  expand(std::fabs(d), x);
  round_to(x, std::int64_t{x.point} + precision);
  if (std::signbit(d)) w.put('-');
  if (x.count == 0 || x.point <= 0) {
    w.put('0');
  } else {
    for (int i = 0; i < x.point && w.room(); ++i) w.put(digit_at(x, i));
  }
  if (precision > 0) w.put('.');
  for (int f = 0; f < precision && w.room(); ++f) w.put(digit_at(x, std::int64_t{x.point} + f));
  return text;
}

std::string format_scientific_reference(double d, std::int64_t digits) {
  // The precision is read as a C int; a negative one means the default, 6.
  std::int32_t precision = static_cast<std::int32_t>(digits);
  if (precision < 0) precision = 6;
  std::string text;
  writer w{text, 498};
  if (put_special(w, d)) return text;
  if (std::signbit(d)) w.put('-');
  exact_decimal x;
  expand(std::fabs(d), x);
  round_to(x, std::int64_t{precision} + 1);
  w.put(x.count == 0 ? '0' : x.digits[0]);
  if (precision > 0) w.put('.');
  for (std::int64_t i = 1; i <= precision && w.room(); ++i) w.put(digit_at(x, i));
  const int exponent = x.count == 0 ? 0 : x.point - 1;
  w.put('e');
  w.put(exponent < 0 ? '-' : '+');
  const int magnitude = exponent < 0 ? -exponent : exponent;
  if (magnitude >= 100) w.put(static_cast<char>('0' + magnitude / 100));
  w.put(static_cast<char>('0' + magnitude / 10 % 10));
  w.put(static_cast<char>('0' + magnitude % 10));
  return text;
}

std::string format_plain_reference(double d) {
  const std::string f = format_fixed_reference(d, 99);
  if (!std::isfinite(d)) return f;
  std::size_t len = f.size();
  while (len >= 4 && f[len - 1] == '0' && f[len - 2] == '0') --len;

  const std::size_t point = f.find('.');
  if (point == std::string::npos) return f;  // "%.99f" of a finite value always has one
  const auto k = static_cast<std::size_t>(std::count_if(
      f.begin(), f.begin() + static_cast<std::ptrdiff_t>(point), [](char c) { return c != '0'; }));
  std::size_t next;  // position in f of the first digit after the kept text
  if (k > 14) {
    len = point;
    next = point + 1;
  } else {
    std::size_t j = point + 1;
    while (j < len && f[j] == '0') ++j;
    len = std::min(len, j + 15 - k);
    next = len;
  }

  std::string t = f.substr(0, len);
  if (next < f.size() && f[next] >= '5') {  // round up, carrying leftwards over the point
    std::ptrdiff_t i = static_cast<std::ptrdiff_t>(len) - 1;
    for (; i >= 0 && t[i] != '-'; --i) {
      if (t[i] == '.') continue;
      if (t[i] != '9') break;
      t[i] = '0';
    }
    if (i >= 0 && t[i] != '-') {
      ++t[i];
    } else {  // carried past the first digit: a new leading 1
      t.insert(static_cast<std::size_t>(i + 1), 1, '1');
    }
  }
  if (k <= 14) {  // the text has its point
    while (t[t.size() - 1] == '0' && t[t.size() - 2] == '0') t.pop_back();
  }
  return t;
}

}  // namespace zul::reference
