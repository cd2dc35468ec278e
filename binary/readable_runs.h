// Readable runs in arbitrary bytes: maximal stretches of printable ASCII,
// tab, line feed, carriage return and well-formed UTF-8 multi-byte characters
// (the Unicode standard's table of well-formed byte sequences: no overlong
// forms, no surrogates, nothing above U+10FFFF). Scanning is one pass: every
// byte is classified once, runs that are dropped included.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

#include "common/scan.h"

namespace zul::binary {

namespace detail {

struct run_measure {
  std::size_t length;  // bytes of readable units from the start position
  bool visible;        // some byte of the run is 0x21 or above
};

// The readable run that starts at data[pos] (pos < data.size()): it ends at
// the first byte that does not begin a readable unit, or before a
// multi-byte unit that is malformed or cut by the end of the data.
// scan is the byte-set search to use (tests pass every level's).
run_measure measure_run(std::span<const std::uint8_t> data, std::size_t pos,
                        const scan_kernels& scan = machine_scan());

}  // namespace detail

// Calls on_run(std::span<const std::uint8_t>) for every kept run, in data
// order. A run is kept when it holds a byte of 0x21 or above (not only
// blanks) and is longer than min_length bytes (a negative min_length counts
// as 0). The byte that ends a run is skipped with it.
template <class OnRun>
void for_each_readable_run(std::span<const std::uint8_t> data, std::int64_t min_length,
                           OnRun&& on_run, const scan_kernels& scan = machine_scan()) {
  const std::uint64_t threshold = min_length < 0 ? 0 : static_cast<std::uint64_t>(min_length);
  std::size_t p = 0;
  while (p < data.size()) {
    const detail::run_measure run = detail::measure_run(data, p, scan);
    if (run.length == 0) {
      ++p;
      continue;
    }
    if (run.visible && run.length > threshold) on_run(data.subspan(p, run.length));
    p += run.length + 1;
  }
}

}  // namespace zul::binary
