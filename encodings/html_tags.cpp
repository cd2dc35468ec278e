// Tag removal: one pass over the bytes; output reserved once for the worst
// case (every byte replaced), capped at the result limit, where removal
// stops. A byte-set search finds the next bracket or zero byte; the
// run before it is copied whole outside tags, and skipped whole inside tags
// when the replacement is empty. The bytes after it, and bytes inside tags
// with a replacement to write, go one by one.
#include "encodings/html_tags.h"

#include <cstdint>

namespace zul::encodings {
namespace {

constexpr simd::byte_set kBrackets =
    byte_set_where([](std::uint8_t b) { return b == '<' || b == '>' || b == '\0'; });

// Bytes taken one by one after each search: a few, doubling while searches
// keep finding short runs (markup dense with brackets), back to a few after
// a long run.
constexpr std::size_t kAfterMin = 4, kAfterMax = 512, kShortRun = 16;

}  // namespace

out_buffer remove_html_tags(std::string_view utf8, std::string_view replacement,
                            std::uint64_t limit, const scan_kernels& scan) {
  const auto* p = reinterpret_cast<const std::uint8_t*>(utf8.data());
  const std::size_t n = utf8.size();
  // The worst case (every byte replaced) reserved once, capped at the limit.
  const std::size_t worst =
      worst_case_reserve(n, replacement.size() > 1 ? replacement.size() : 1, 10, limit);
  out_buffer out(worst + out_buffer::kSlack, limit);
  std::int64_t depth = 0;
  std::size_t after = kAfterMin;
  std::size_t i = 0;
  while (i < n) {
    if (depth == 0 || replacement.empty()) {
      // Outside tags the run is copied, inside (with nothing to write) skipped.
      const std::size_t run = scan.find_first(kBrackets, p + i, n - i);
      if (depth == 0) {
        if (!out.ensure(run)) return out.discard();
        out.put(p + i, run);
      }
      i += run;
      after = run < kShortRun ? (after < kAfterMax ? 2 * after : after) : kAfterMin;
    }
    const std::size_t stop = n - i > after ? i + after : n;
    if (!out.ensure(stop - i)) return out.discard();  // room for the bytes kept
    for (; i < stop; ++i) {
      const std::uint8_t c = p[i];
      if (c == '<') {
        ++depth;
      } else if (c == '>') {
        --depth;
      } else if (c == '\0') {
        continue;
      } else if (depth == 0) {
        out.put_byte(c);
      } else {
        if (!out.ensure(replacement.size() + (stop - i))) return out.discard();
        out.put(replacement);
      }
    }
  }
  if (!out.fits()) return out.discard();
  return out;
}

}  // namespace zul::encodings
