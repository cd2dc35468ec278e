// XML escaping: one pass, output reserved once for the worst case (6 code
// points per character), capped at the result limit; the five markup
// characters are the only ones XML 1.0 text needs escaped. A code-point
// search (byte-set kernels over UTF-32 lanes) finds the next markup
// character or dropped control; the run before it is copied whole. The
// readiness test is one byte-set search for the first byte that is not
// allowed.
#include "encodings/xml.h"

#include "common/byte_set.h"
#include "common/markup.h"
#include "common/size_gate.h"

namespace zul::encodings {
namespace {

// Characters the escaper changes; none from U+0080 up (255 is not in it).
constexpr simd::byte_set kEscapeWork =
    byte_set_where([](std::uint8_t b) { return is_markup(b) || is_dropped_control(b); });
constexpr simd::byte_set kMarkup = byte_set_where([](std::uint8_t b) { return is_markup(b); });

// Characters taken one by one after one that needs work: a few, doubling
// while searches keep finding short runs, back to a few after a long run.
constexpr std::size_t kAfterMin = 8, kAfterMax = 512, kShortRun = 16;

// The reference that replaces c, or an empty view when c is kept or
// dropped.
std::string_view reference_for(std::uint32_t c, bool named_apostrophe) {
  switch (c) {
    case '"':
      return "&quot;";
    case '&':
      return "&amp;";
    case '\'':
      return named_apostrophe ? "&apos;" : "&#39;";
    case '<':
      return "&lt;";
    case '>':
      return "&gt;";
    default:
      return {};
  }
}

// Appends the text of character c (at most 6 code points); false, writing
// nothing, when room for it cannot be had within limit.
bool append_character(code_points& out, std::uint32_t c, bool named_apostrophe, std::uint64_t limit,
                      bool room_made) {
  const std::string_view reference = reference_for(c, named_apostrophe);
  if (!reference.empty()) {
    if (!room_made && !make_room(out, reference.size(), limit)) return false;
    out.insert(out.end(), reference.begin(), reference.end());
  } else if (!is_dropped_control(c)) {
    if (!room_made && !make_room(out, 1, limit)) return false;
    out.push_back(c);
  }
  return true;
}

// Bytes a ready string may not hold: 0, 128 and above, the five markup
// bytes. The check is one byte-set search for the first of them.
constexpr simd::byte_set kNotReady = [] {
  simd::byte_set not_ready;
  for (std::uint32_t b = 0; b < 256; ++b) {
    if (b == 0 || b >= 128 || is_markup(b)) not_ready.add(static_cast<std::uint8_t>(b));
  }
  return not_ready;
}();

}  // namespace

bool xml_needs_escaping(code_point_view text) {
  return simd::find_first_code_point_in_set(kMarkup, text.data(), text.size()) != text.size();
}

code_points encode_xml(code_point_view text, std::int64_t options, std::uint64_t limit,
                       const scan_kernels& scan) {
  text = skip_byte_order_mark(text);
  const bool named_apostrophe = (options & 1) != 0;
  const std::uint32_t* p = text.data();
  const std::size_t n = text.size();
  code_points out;
  out.reserve(worst_case_reserve(n, 6, 0, limit));
  std::size_t i = 0;
  std::size_t after = kAfterMin;
  while (i < n) {
    const std::size_t run = scan.find_first_code_point(kEscapeWork, p + i, n - i);
    if (!make_room(out, run, limit)) return {};
    out.insert(out.end(), p + i, p + i + run);
    i += run;
    if (i == n) break;
    after = run < kShortRun ? (after < kAfterMax ? 2 * after : after) : kAfterMin;
    const std::size_t stop = n - i > after ? i + after : n;
    // Room for the worst case of the group at once; near the limit, room
    // for each character, so that only a result past it is refused.
    const bool room_made = make_room(out, 6 * (stop - i), limit);
    for (; i < stop; ++i) {
      if (!append_character(out, p[i], named_apostrophe, limit, room_made)) return {};
    }
  }
  return out;
}

bool is_markup_free_ascii(std::string_view bytes) {
  return simd::find_first_in_set(kNotReady, bytes_of(bytes)) == bytes.size();
}

}  // namespace zul::encodings
