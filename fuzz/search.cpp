// Fuzz target for the byte search. The first byte picks the function, the
// next bytes give the set length and the ranges, the rest is the target.
// Invariants:
//  1. no crash, no read outside the inputs (run under the sanitizers);
//  2. the result is 0 or a position within the target;
//  3. the table-driven search equals the scalar reference.
#include <cstdint>
#include <cstdlib>
#include <span>

#include "fuzz/fuzz_check.h"
#include "search/byte_search.h"
#include "tests/reference/byte_search_reference.h"

using zul_fuzz::check;
using namespace zul::search;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size < 8) return 0;
  const int which = data[0] % 3;
  const std::size_t set_length = data[1] % 8;
  const byte_range ranges[] = {
      {static_cast<std::int8_t>(data[2]) * 3, static_cast<std::int8_t>(data[3]) * 3},
      {data[4], data[5]},
      {static_cast<std::int8_t>(data[6]), data[7]}};
  std::span<const std::uint8_t> rest(data + 8, size - 8);
  const std::size_t n = set_length < rest.size() ? set_length : rest.size();
  const auto set = rest.first(n);
  const auto target = rest.subspan(n);
  const std::span<const byte_range> some(ranges, 1 + data[1] % 3);

  std::int64_t got = 0, want = 0;
  switch (which) {
    case 0:
      got = find_first_of(target, set);
      want = zul::reference::find_first_of_reference(target, set);
      break;
    case 1:
      got = find_in_ranges(target, some);
      want = zul::reference::find_in_ranges_reference(target, some);
      break;
    default:
      got = find_in_signed_ranges_or_set(target, some, set);
      want = zul::reference::find_in_signed_ranges_or_set_reference(target, some, set);
      break;
  }
  check(got >= 0 && got <= static_cast<std::int64_t>(target.size()));
  check(got == want);
  return 0;
}
