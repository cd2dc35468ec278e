// HTML reference encoder and decoder over code points, one pass each. A
// code-point search (byte-set kernels over UTF-32 lanes) finds the next
// character that needs work; the encoder narrows the ASCII run before it to
// bytes in the same pass, the decoder copies the run before the next "&"
// whole. Only those characters take the rules one by one: ASCII from a
// 128-entry table per mode, U+0080 up through the entity index. Row-by-row
// references live with the tests (tests/reference/).
#include "encodings/html.h"

#include <array>
#include <charconv>
#include <cstring>
#include <optional>
#include <string_view>

#include "common/markup.h"
#include "common/size_gate.h"
#include "encodings/html_entities.h"

namespace zul::encodings {
namespace {

// The longest text one character becomes: "&#4294967295;".
constexpr std::size_t kMaxReferenceBytes = 13;

// Characters the encoder changes in each mode: dropped controls, U+0080 and
// up (255 stands for them all in a code-point search) and, when escaping,
// the five markup characters.
constexpr simd::byte_set kEncodeWork = byte_set_where(
    [](std::uint8_t b) { return b >= 128 || is_dropped_control(b) || is_markup(b); });
constexpr simd::byte_set kEncodeWorkKeepMarkup =
    byte_set_where([](std::uint8_t b) { return b >= 128 || is_dropped_control(b); });
constexpr simd::byte_set kNeedsEscaping =
    byte_set_where([](std::uint8_t b) { return b >= 128 || is_markup(b); });
constexpr simd::byte_set kAmpersand = byte_set_where([](std::uint8_t b) { return b == '&'; });

// Characters taken one by one after one that needs work: a few, doubling
// while searches keep finding short runs (text dense with references), back
// to a few after a long run. Runs are narrowed kChunk characters at a time so
// that each request for room stays small.
constexpr std::size_t kAfterMin = 8, kAfterMax = 512, kShortRun = 16, kChunk = 4096;

// What the encoder writes for each ASCII character in one mode; an empty
// text drops the character.
using ascii_actions = std::array<std::string_view, 128>;

// Each ASCII character as a one-character text, for the tables below.
constexpr std::array<char, 128> kAsciiChars = [] {
  std::array<char, 128> chars{};
  for (std::size_t c = 0; c < chars.size(); ++c) chars[c] = static_cast<char>(c);
  return chars;
}();

constexpr ascii_actions make_ascii_actions(bool escape_markup) {
  ascii_actions actions{};
  for (std::uint32_t c = 0; c < 128; ++c) {
    if (is_dropped_control(c)) continue;
    actions[c] = std::string_view(&kAsciiChars[c], 1);
  }
  if (escape_markup) {
    actions['"'] = "&quot;";
    actions['&'] = "&amp;";
    actions['\''] = "&#39;";
    actions['<'] = "&lt;";
    actions['>'] = "&gt;";
  }
  return actions;
}

constexpr ascii_actions kEscapeMarkup = make_ascii_actions(true);
constexpr ascii_actions kKeepMarkup = make_ascii_actions(false);

// The value of a reference name (the characters between "&" and ";"), or
// nothing when the name is no reference.
std::optional<std::uint32_t> reference_value(code_point_view name) {
  char ascii[8];
  bool all_ascii = true;
  for (std::size_t k = 0; k < name.size(); ++k) {
    if (name[k] > 127) all_ascii = false;
    ascii[k] = static_cast<char>(name[k]);
  }
  if (all_ascii) {
    if (auto cp = entity_code_point(std::string_view(ascii, name.size()))) return cp;
  }
  if (name[0] != '#') return std::nullopt;
  const bool hex = name.size() >= 2 && name[1] == 'x';
  std::int64_t value = 0;
  bool negative = false;
  // At most 7 digits fit in a name, so the value cannot overflow.
  for (std::size_t k = hex ? 2 : 1; k < name.size(); ++k) {
    const std::uint32_t c = name[k];
    if (c >= '0' && c <= '9') {
      value = value * (hex ? 16 : 10) + (c - '0');
    } else if (hex && c >= 'a' && c <= 'f') {
      value = value * 16 + (c - 'a' + 10);
    } else if (hex && c >= 'A' && c <= 'F') {
      value = value * 16 + (c - 'A' + 10);
    } else if (c == '-') {
      negative = true;
    } else {
      break;
    }
  }
  if (negative) value = -value;
  if (value < 1) return std::nullopt;
  return static_cast<std::uint32_t>(value);
}

// Writes the text of character c at o and returns the end.
std::uint8_t* write_character(std::uint8_t* o, std::uint32_t c, const ascii_actions& actions) {
  if (c < 128) {
    const std::string_view text = actions[c];
    if (text.empty()) return o;  // a dropped control
    std::memcpy(o, text.data(), text.size());
    return o + text.size();
  }
  *o++ = '&';
  if (const std::string_view name = entity_name(c, true); !name.empty()) {
    std::memcpy(o, name.data(), name.size());
    o += name.size();
  } else {
    *o++ = '#';
    char* digits = reinterpret_cast<char*>(o);
    o = reinterpret_cast<std::uint8_t*>(std::to_chars(digits, digits + 10, c).ptr);
  }
  *o++ = ';';
  return o;
}

}  // namespace

code_points decode_html(code_point_view text, std::uint64_t limit, const scan_kernels& scan) {
  text = skip_byte_order_mark(text);
  const std::size_t n = text.size();
  code_points out;
  out.reserve(worst_case_reserve(n, 1, 0, limit));
  std::size_t i = 0;
  while (i < n) {
    // References back to back need no search.
    const std::size_t run =
        text[i] == '&' ? i : i + scan.find_first_code_point(kAmpersand, text.data() + i, n - i);
    if (run != i) {
      if (!make_room(out, run - i, limit)) return {};
      out.insert(out.end(), text.begin() + static_cast<std::ptrdiff_t>(i),
                 text.begin() + static_cast<std::ptrdiff_t>(run));
      i = run;
      if (i == n) break;
    }
    // text[i] is "&". Its name ends at ";" within 8 characters, or at the
    // end of the text.
    std::size_t length = 0;
    bool bounded = false;
    for (std::size_t k = 0; k <= 8; ++k) {
      const std::size_t pos = i + 1 + k;
      if (pos >= n || text[pos] == ';') {
        length = k;
        bounded = true;
        break;
      }
    }
    if (bounded && length > 0) {
      if (auto cp = reference_value(text.subspan(i + 1, length))) {
        if (!make_room(out, 1, limit)) return {};
        out.push_back(*cp);
        i += length + 2;
        continue;
      }
    }
    if (!make_room(out, 1, limit)) return {};
    out.push_back('&');
    ++i;
  }
  return out;
}

bool html_needs_escaping(code_point_view text) {
  return simd::find_first_code_point_in_set(kNeedsEscaping, text.data(), text.size()) !=
         text.size();
}

namespace {

// Copies the run of text before the first member of work to out, as bytes
// (code points narrowed to min(c, 255)); returns its length. out has room
// for n + 64 bytes.
std::size_t copy_run(const scan_kernels& scan, const simd::byte_set& work, const std::uint32_t* p,
                     std::size_t n, std::uint8_t* out) {
  return scan.narrow_until_member(work, p, n, out);
}
std::size_t copy_run(const scan_kernels& scan, const simd::byte_set& work, const std::uint8_t* p,
                     std::size_t n, std::uint8_t* out) {
  const std::size_t run = scan.find_first(work, p, n);
  if (run != 0) std::memcpy(out, p, run);
  return run;
}

// The encoder over code points, or over ASCII bytes (which are their own
// code points).
template <class Unit>
out_buffer encode_html_units(std::span<const Unit> text, std::int64_t options, std::uint64_t limit,
                             const scan_kernels& scan) {
  const bool keep_markup = (options & 1) != 0;
  const ascii_actions& actions = keep_markup ? kKeepMarkup : kEscapeMarkup;
  const simd::byte_set& work = keep_markup ? kEncodeWorkKeepMarkup : kEncodeWork;
  const Unit* p = text.data();
  const std::size_t n = text.size();
  // Typical text grows little; the buffer grows (rarely) for more.
  out_buffer out(worst_case_reserve(n, 1, n / 8 + 64, limit), limit);
  std::size_t i = 0;
  std::size_t after = kAfterMin;
  while (i < n) {
    const std::size_t chunk = n - i < kChunk ? n - i : kChunk;
    if (!out.ensure(chunk + 64)) return out.discard();
    const std::size_t run = copy_run(scan, work, p + i, chunk, out.tail());
    out.commit(run);
    i += run;
    if (run == chunk) continue;
    after = run < kShortRun ? (after < kAfterMax ? 2 * after : after) : kAfterMin;
    const std::size_t stop = n - i > after ? i + after : n;
    if (!out.ensure((stop - i) * kMaxReferenceBytes)) return out.discard();
    std::uint8_t* const first = out.tail();
    std::uint8_t* o = first;
    for (; i < stop; ++i) o = write_character(o, p[i], actions);
    out.commit(static_cast<std::size_t>(o - first));
  }
  if (!out.fits()) return out.discard();
  return out;
}

}  // namespace

out_buffer encode_html(code_point_view text, std::int64_t options, std::uint64_t limit,
                       const scan_kernels& scan) {
  return encode_html_units(skip_byte_order_mark(text), options, limit, scan);
}

bool ascii_html_needs_escaping(bytes_view ascii) {
  return simd::find_first_in_set(kNeedsEscaping, ascii) != ascii.size();
}

out_buffer encode_ascii_html(bytes_view ascii, std::int64_t options, std::uint64_t limit,
                             const scan_kernels& scan) {
  return encode_html_units(ascii, options, limit, scan);
}

}  // namespace zul::encodings
