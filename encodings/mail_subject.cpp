// Mail subject encoding: one pass with output reserved once for the worst
// case (3 bytes per input byte + 12), capped at the result limit, where
// encoding stops. A byte-set search finds the next byte that needs work; the
// run before it is copied whole, and that byte and the next few take the
// rule one by one (more of them while runs stay short). Control bytes are encoded too, since RFC
// 2047 allows no tab or control byte unencoded inside an encoded word.
#include "encodings/mail_subject.h"

#include "common/bytes.h"
#include "common/hex_digits.h"
#include "common/size_gate.h"

namespace zul::encodings {

namespace {

// Bytes the encoded word writes as something else.
constexpr simd::byte_set kSubjectWork = byte_set_where([](std::uint8_t b) {
  return b == ' ' || b < 32 || b >= 127 || b == '=' || b == '?' || b == '_';
});
// Bytes that make a subject need encoding (127 does not).
constexpr simd::byte_set kNeedsEncoding =
    byte_set_where([](std::uint8_t b) { return b < 32 || b > 127; });

// Bytes taken one by one after one that needs work: a few, doubling while
// searches keep finding short runs, back to a few after a long run.
constexpr std::size_t kAfterMin = 8, kAfterMax = 512, kShortRun = 16;

}  // namespace

bool subject_needs_encoding(std::string_view utf8) {
  return simd::find_first_in_set(kNeedsEncoding, bytes_of(utf8)) != utf8.size();
}

std::string encode_mail_subject(std::string_view utf8, std::uint64_t limit,
                                const scan_kernels& scan) {
  const auto* p = reinterpret_cast<const std::uint8_t*>(utf8.data());
  const std::size_t n = utf8.size();
  std::string out;
  out.reserve(worst_case_reserve(n, 3, 12, limit));
  if (!make_room(out, 10, limit)) return {};
  out += "=?utf-8?Q?";
  std::size_t i = 0;
  std::size_t after = kAfterMin;
  while (i < n) {
    const std::size_t run = scan.find_first(kSubjectWork, p + i, n - i);
    if (!make_room(out, run, limit)) return {};
    out.append(utf8.data() + i, run);
    i += run;
    if (i == n) break;
    after = run < kShortRun ? (after < kAfterMax ? 2 * after : after) : kAfterMin;
    const std::size_t stop = n - i > after ? i + after : n;
    for (; i < stop; ++i) {
      if (!make_room(out, 3, limit)) return {};
      const std::uint8_t b = p[i];
      if (b == ' ') {
        out += '_';
      } else if (kSubjectWork.contains(b)) {
        const char escape[3] = {'=', kHexDigits[b >> 4], kHexDigits[b & 15]};
        out.append(escape, 3);
      } else {
        out += static_cast<char>(b);
      }
    }
  }
  if (!make_room(out, 2, limit)) return {};
  out += "?=";
  return out;
}

}  // namespace zul::encodings
