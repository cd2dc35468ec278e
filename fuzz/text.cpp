// Fuzz target for counting, distances, UTF-8 repair, byte classes, the
// single-byte character sets and number formatting. The first byte picks
// the function; the rest is the input.
// Invariants:
//  1. no crash, no read outside the input (run under the sanitizers);
//  2. fast paths equal their references: UTF-8 repair, byte classes,
//     single-byte encoding, both distances, the plain number text;
//  3. repaired text with a well-formed placeholder is well-formed;
//     decoding then encoding ISO 8859-1 gives the bytes back;
//  4. the number texts equal what an exact C library prints ("%.Ne" and
//     "%.Nf"), which the C library of this machine is.
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "fuzz/fuzz_check.h"
#include "search/distance.h"
#include "tests/reference/char_class_reference.h"
#include "tests/reference/distance_reference.h"
#include "tests/reference/latin1_reference.h"
#include "tests/reference/number_format_reference.h"
#include "tests/reference/utf8_repair_reference.h"
#include "text/char_class.h"
#include "text/latin1.h"
#include "text/number_format.h"
#include "text/utf8_repair.h"

namespace {

using zul_fuzz::bytes_of;
using zul_fuzz::check;

using namespace zul::text;

std::string handle_bytes(const owned_handle& h) {
  if (!h) return {};
  const handle_lock lock(h.get());
  return {reinterpret_cast<const char*>(lock.data()), h.size()};
}

void check_repair(std::span<const std::uint8_t> data, std::uint8_t knob) {
  static constexpr std::string_view kPlaceholders[] = {"", "?", "\xEF\xBF\xBD", "\xFF"};
  const std::string_view placeholder = kPlaceholders[knob % 4];
  const std::string repaired = zul::reference::repair_utf8_reference(data, placeholder);
  for (const zul::simd::isa level : zul::simd::supported_isas()) {
    check(repair_utf8(data, placeholder, zul::kMaxResultBytes,
                      zul::simd::kernels_for(zul::simd::utf8_tables(), level))
              .view() == repaired);
  }
  if (knob % 4 != 3) check(well_formed_prefix(bytes_of(repaired)) == repaired.size());
  check(well_formed_prefix(data) <= data.size());
}

void check_classes(std::span<const std::uint8_t> data, std::uint8_t replacement) {
  for (auto cls : {byte_class::seven_bit, byte_class::printable, byte_class::non_control}) {
    check(all_bytes_in(data, cls) == zul::reference::all_bytes_in_reference(data, cls));
  }
  const std::string replaced(replace_non_printable(data, replacement).view());
  check(replaced.size() == data.size());
  for (std::size_t i = 0; i < data.size(); ++i) {
    const bool kept = data[i] >= 0x20 && data[i] <= 0x7F;
    check(static_cast<std::uint8_t>(replaced[i]) == (kept ? data[i] : replacement));
  }
}

// Native-order UTF-16 units from bytes (an odd last byte is dropped).
std::vector<std::uint16_t> units_of(std::string_view bytes) {
  std::vector<std::uint16_t> units(bytes.size() / 2);
  if (!units.empty()) std::memcpy(units.data(), bytes.data(), units.size() * 2);
  return units;
}

void check_single_byte(std::span<const std::uint8_t> data) {
  const std::vector<std::uint16_t> units =
      units_of({reinterpret_cast<const char*>(data.data()), data.size()});
  for (const zul::simd::isa level : zul::simd::supported_isas()) {
    const single_byte_kernels& kernels = zul::simd::kernels_for(single_byte_tables(), level);
    check(handle_bytes(encode_single_byte(units, kISO8859_1, kHandleLimit, kernels)) ==
          zul::reference::encode_single_byte_reference(units, escapecharsISO8859));
    check(handle_bytes(encode_single_byte(units, kWindows1252, kHandleLimit, kernels)) ==
          zul::reference::encode_single_byte_reference(units, escapecharsCP1252));
    const std::string decoded =
        handle_bytes(decode_single_byte(data, kWindows1252, kHandleLimit, kernels));
    for (std::size_t i = 0; i < data.size(); ++i) {
      std::uint16_t unit;
      std::memcpy(&unit, decoded.data() + 2 * i, 2);
      check(unit == escapecharsCP1252[data[i]]);
    }
  }
  const owned_handle wide = decode_single_byte(data, kISO8859_1);
  const std::vector<std::uint16_t> back = units_of(handle_bytes(wide));
  check(handle_bytes(encode_single_byte(back, kISO8859_1)) ==
        std::string(data.begin(), data.end()));
}

void check_distances(std::span<const std::uint8_t> data, std::uint8_t knob) {
  // Small alphabets make matches and transpositions likely.
  const std::uint32_t alphabet = 2 + knob % 8;
  const std::uint32_t base = (knob & 0x40) ? 0x1F600 : 0x60;  // beyond the byte table or not
  std::vector<std::uint32_t> a, b;
  const std::size_t split = data.empty() ? 0 : knob % (data.size() + 1);
  for (std::size_t i = 0; i < data.size(); ++i)
    (i < split ? a : b).push_back(base + data[i] % alphabet);
  check(zul::search::edit_distance(a, b) == zul::reference::edit_distance_reference(a, b));
  if (!a.empty() && !b.empty()) {
    check(zul::search::detail::edit_distance_blocks(a, b) ==
          zul::reference::edit_distance_reference(a, b));
  }
  const double jw = zul::reference::jaro_winkler_distance_reference(a, b);
  const auto got = zul::search::jaro_winkler_distance(a, b);
  check(got.unallocated_bytes == 0 && got.value == jw);
  if (!a.empty() && !b.empty()) check(zul::search::detail::jaro_winkler_lists(a, b).value == jw);
}

void check_numbers(std::span<const std::uint8_t> data, std::uint8_t knob) {
  if (data.size() < 8) return;
  double d;
  std::memcpy(&d, data.data(), sizeof d);
  if (std::isnan(d)) return;  // the C library may print "-nan"
  char want[600];
  const int digits = knob % 40;
  std::snprintf(want, sizeof want, "%.*e", digits, d);
  check(format_scientific(d, digits).view() == want);
  const int precision = knob % 120;
  std::snprintf(want, sizeof want, "%.*f", precision, d);
  check(zul::reference::format_fixed_reference(d, precision) ==
        std::string_view(want).substr(0, 499));
  check(format_plain(d).view() == zul::reference::format_plain_reference(d));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size < 2) return 0;
  const std::span<const std::uint8_t> rest(data + 2, size - 2);
  switch (data[0] % 5) {
    case 0:
      check_repair(rest, data[1]);
      break;
    case 1:
      check_classes(rest, data[1]);
      break;
    case 2:
      check_single_byte(rest);
      break;
    case 3:
      check_distances(rest, data[1]);
      break;
    default:
      check_numbers(rest, data[1]);
      break;
  }
  return 0;
}
