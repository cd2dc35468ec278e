// Fuzz target for the binary strings. The first byte picks the function,
// the next bytes give a mask length, an offset and layout sizes; the rest
// is the data.
// Invariants:
//  1. no crash, no read outside the inputs (run under the sanitizers);
//  2. the word-wise AND / OR / XOR equal the byte rule for every start;
//     XOR with the same mask and offset, applied twice, gives the data back;
//  3. hex encoding equals its reference and decodes back to the bytes;
//  4. a hex dump is exactly as long as its computed length;
//  5. readable runs lie inside the data, in order, without overlap, longer
//     than the minimum, well-formed UTF-8 and not only blanks.
#include <cstdint>
#include <cstdlib>
#include <span>
#include <string>
#include <string_view>

#include "binary/bitwise.h"
#include "binary/hex.h"
#include "binary/hex_dump.h"
#include "binary/readable_runs.h"
#include "fuzz/fuzz_check.h"
#include "tests/reference/bitwise_reference.h"
#include "tests/reference/hex_reference.h"
#include "text/utf8_repair.h"

namespace {

using zul_fuzz::bytes_of;
using zul_fuzz::check;

using namespace zul::binary;

void check_bitwise(std::span<const std::uint8_t> data, std::span<const std::uint8_t> mask,
                   std::int64_t offset) {
  if (mask.empty()) return;
  const std::size_t start = detail::mask_start(offset, mask.size());
  check(start < mask.size());
  std::string fast(data.size(), '\0');
  for (auto op : {detail::bit_op::kAnd, detail::bit_op::kOr, detail::bit_op::kXor}) {
    detail::combine_fast(op, data, mask, start, reinterpret_cast<std::uint8_t*>(fast.data()));
    check(fast == zul::reference::combine_reference(op, data, mask, start));
  }
  const std::string once(xor_with_mask(data, mask, offset).view());
  check(xor_with_mask(bytes_of(once), mask, offset) == std::string(data.begin(), data.end()));
  const std::string mixed(xor_with_mask_and_position(data, mask, offset).view());
  check(xor_with_mask_and_position(bytes_of(mixed), mask, offset) ==
        std::string(data.begin(), data.end()));
}

void check_hex(std::span<const std::uint8_t> data) {
  const std::string digits(encode_hex(data).view());
  check(digits == zul::reference::encode_hex_reference(data));
  check(decode_hex(digits) == std::string(data.begin(), data.end()));
  const std::string_view as_text(reinterpret_cast<const char*>(data.data()), data.size());
  check(decode_hex(as_text).size() == data.size() / 2);
}

void check_dump(std::span<const std::uint8_t> data, const std::uint8_t* knobs) {
  // Layout texts are cut from the data itself so that they vary too.
  const std::string_view text(reinterpret_cast<const char*>(data.data()), data.size());
  auto piece = [&](std::size_t at, std::size_t n) {
    return text.substr(std::min(at, text.size()), n);
  };
  const hex_dump_layout layout{static_cast<std::int8_t>(knobs[0]) / 8,
                               static_cast<std::int8_t>(knobs[1]) / 8,
                               piece(0, knobs[2] % 4),
                               piece(1, knobs[2] / 4 % 4),
                               piece(2, knobs[2] / 16 % 4),
                               piece(3, knobs[2] / 64)};
  check(hex_dump(data, layout).size() == detail::hex_dump_length(data.size(), layout));
}

void check_runs(std::span<const std::uint8_t> data, std::int64_t min_length) {
  const std::uint8_t* next = data.data();
  for_each_readable_run(data, min_length, [&](std::span<const std::uint8_t> run) {
    check(run.data() >= next && run.data() + run.size() <= data.data() + data.size());
    check(static_cast<std::int64_t>(run.size()) > min_length && !run.empty());
    check(zul::text::well_formed_prefix(run) == run.size());
    bool visible = false;
    for (const std::uint8_t b : run) {
      check(b >= 0x20 || b == '\t' || b == '\n' || b == '\r');
      check(b != 0x7F);
      visible = visible || b >= 0x21;
    }
    check(visible);
    next = run.data() + run.size() + 1;
  });
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size < 4) return 0;
  const std::uint8_t pick = data[0];
  const std::span<const std::uint8_t> rest(data + 4, size - 4);
  switch (pick % 4) {
    case 0: {
      // Mask lengths 1, 2 and 4 take the word-wise paths; longer ones the
      // general path; a mask as long as the data the straight one.
      const std::size_t m = std::min<std::size_t>(1 + data[1] % 12, rest.size());
      check_bitwise(rest.subspan(m), rest.first(m), static_cast<std::int8_t>(data[2]));
      check_bitwise(rest, rest, static_cast<std::int8_t>(data[2]));
      break;
    }
    case 1:
      check_hex(rest);
      break;
    case 2:
      check_dump(rest, data + 1);
      break;
    default:
      check_runs(rest, static_cast<std::int8_t>(data[1]) / 16);
      break;
  }
  return 0;
}
