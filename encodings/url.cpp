// Percent-encoding: one pass over the input into a buffer reserved once for
// the worst case (3 bytes per input byte) and never zero-filled. A byte-set
// search finds the next byte that needs work; the run before it is copied
// whole, and that byte and the next few take the table one by one, more of
// them while searches keep finding short runs, so text dense with escapes
// does not pay a search per byte. The encoder reads
// one of three immutable 256-entry tables chosen by the options (options 0
// and 3 share one), so concurrent calls with different options never
// interfere.
#include "encodings/url.h"

#include <array>
#include <cstring>

#include "common/hex_digits.h"

namespace zul::encodings {
namespace {

constexpr bool is_unreserved(unsigned b) {
  return (b >= 'A' && b <= 'Z') || (b >= 'a' && b <= 'z') || (b >= '0' && b <= '9') || b == '!' ||
         b == '*' || b == '-' || b == '.' || b == '@' || b == '_';
}

bool plus_as_space(std::int64_t options) { return (options & 1) != 0; }

// One replacement: its length (1 or 3) and up to 4 bytes written at once.
struct escape {
  std::uint8_t length;
  char text[4];
};
using escape_table = std::array<escape, 256>;

constexpr escape_table make_table(bool space_plus, bool plus_escaped) {
  escape_table table{};
  for (unsigned b = 0; b < 256; ++b) {
    if (is_unreserved(b) || (b == '+' && !plus_escaped) || (b == ' ' && space_plus)) {
      table[b] = {1, {static_cast<char>(b == ' ' ? '+' : b), 0, 0, 0}};
    } else {
      table[b] = {3, {'%', kHexDigits[b >> 4], kHexDigits[b & 15], 0}};
    }
  }
  return table;
}

constexpr escape_table kPlain = make_table(false, false);       // options 0, 3
constexpr escape_table kSpacePlus = make_table(true, true);     // options 1
constexpr escape_table kPlusEscaped = make_table(false, true);  // options 2

const escape_table& table_for(std::int64_t options) {
  switch (options & 3) {
    case 1:
      return kSpacePlus;
    case 2:
      return kPlusEscaped;
    default:
      return kPlain;
  }
}

// Bytes that the encoder may change (whether they do depends on the options).
constexpr simd::byte_set kNeedsWork =
    byte_set_where([](std::uint8_t b) { return !is_unreserved(b); });

constexpr simd::byte_set kPercent = byte_set_where([](std::uint8_t b) { return b == '%'; });
constexpr simd::byte_set kPercentPlus =
    byte_set_where([](std::uint8_t b) { return b == '%' || b == '+'; });

// Bytes taken one by one after a byte that needs work: a few, doubling
// while searches keep finding short runs (text dense with escapes), back to
// a few after a long run.
constexpr std::size_t kAfterMin = 8, kAfterMax = 512, kShortRun = 16;

}  // namespace

out_buffer encode_url(std::string_view in, std::int64_t options, std::uint64_t limit,
                      const scan_kernels& scan) {
  const escape_table& table = table_for(options);
  const auto* p = reinterpret_cast<const std::uint8_t*>(in.data());
  const std::size_t n = in.size();
  if (!fits_result(n, limit)) return out_buffer(0);  // every byte gives at least one
  out_buffer out(worst_case_reserve(n, 3, 10, limit) + out_buffer::kSlack, limit);
  std::size_t i = 0;
  std::size_t after = kAfterMin;
  while (i < n) {
    const std::size_t run = scan.find_first(kNeedsWork, p + i, n - i);
    after = run < kShortRun ? (after < kAfterMax ? 2 * after : after) : kAfterMin;
    // The run, then up to `after` entries of 3 bytes stored as 4.
    if (!out.ensure(run + 3 * after + 1)) return out.discard();
    out.put(p + i, run);
    i += run;
    if (i == n) break;
    const std::size_t stop = n - i > after ? i + after : n;
    std::uint8_t* const first = out.tail();
    std::uint8_t* o = first;
    for (; i < stop; ++i) {
      const escape& e = table[p[i]];
      std::memcpy(o, e.text, 4);
      o += e.length;
    }
    out.commit(static_cast<std::size_t>(o - first));
  }
  if (!out.fits()) return out.discard();
  return out;
}

out_buffer decode_url(std::string_view in, std::int64_t options, const scan_kernels& scan) {
  const auto* p = reinterpret_cast<const std::uint8_t*>(in.data());
  const std::size_t n = in.size();
  out_buffer out(n);  // never longer than the input
  const bool plus = plus_as_space(options);
  const simd::byte_set& special = plus ? kPercentPlus : kPercent;
  std::size_t i = 0;
  while (i < n) {
    const std::size_t run = scan.find_first(special, p + i, n - i);
    out.put(p + i, run);
    i += run;
    // Escapes back to back are decoded without a new search.
    while (i < n && (p[i] == '%' || (plus && p[i] == '+'))) {
      if (p[i] == '+') {
        out.put_byte(' ');
        ++i;
        continue;
      }
      const unsigned high = i + 1 < n ? hex_value(static_cast<char>(p[i + 1])) : 0;
      const unsigned low = i + 2 < n ? hex_value(static_cast<char>(p[i + 2])) : 0;
      out.put_byte(static_cast<std::uint8_t>((high << 4) | low));
      i += 3;
    }
  }
  return out;
}

}  // namespace zul::encodings
