// Tag removal: one pass over the bytes; output reserved once for the worst
// case (every byte replaced), capped at the result limit, where removal
// stops. Without a replacement, the level's block kernel (if any) filters
// whole blocks first. Then a byte-set search finds the next bracket or zero
// byte; the run before it is copied whole outside tags, and skipped whole
// inside tags when the replacement is empty. The bytes after it, and bytes
// inside tags with a replacement to write, go one by one.
#include "encodings/html_tags.h"

#include <cstdint>

#include "encodings/html_tags_kernels.h"

namespace zul::encodings {
namespace detail {

const simd::family_tables<tag_kernels>& tag_tables() noexcept {
  static constexpr tag_kernels kNone{nullptr};
#if defined(__x86_64__) || defined(_M_X64)
  static constexpr tag_kernels kVbmi2{strip_tags_avx512_vbmi2};
#endif
  // Built once: whether the AVX-512 level has a kernel depends on VBMI2.
  static const simd::family_tables<tag_kernels> tables = [] {
    simd::family_tables<tag_kernels> t{&kNone};
#if defined(__x86_64__) || defined(_M_X64)
    t.sse2 = &kStripTagsSse2;
    t.avx2 = &kStripTagsAvx2;
    if (simd::has_avx512_vbmi2()) t.avx512 = &kVbmi2;
#endif
    return t;
  }();
  return tables;
}

}  // namespace detail

namespace {

constexpr simd::byte_set kBrackets =
    byte_set_where([](std::uint8_t b) { return b == '<' || b == '>' || b == '\0'; });

// Bytes taken one by one after each search: a few, doubling while searches
// keep finding short runs (markup dense with brackets), back to a few after
// a long run.
constexpr std::size_t kAfterMin = 4, kAfterMax = 512, kShortRun = 16;

}  // namespace

out_buffer remove_html_tags(std::string_view utf8, std::string_view replacement,
                            std::uint64_t limit, simd::isa level) {
  const scan_kernels& scan = scan_for(level);
  const auto* p = reinterpret_cast<const std::uint8_t*>(utf8.data());
  const std::size_t n = utf8.size();
  // The worst case (every byte replaced) reserved once, capped at the limit.
  const std::size_t worst =
      worst_case_reserve(n, replacement.size() > 1 ? replacement.size() : 1, 10, limit);
  out_buffer out(worst + out_buffer::kSlack, limit);
  std::int64_t depth = 0;
  std::size_t after = kAfterMin;
  std::size_t i = 0;
  const auto strip_tags = simd::kernels_for(detail::tag_tables(), level).strip_tags;
  if (strip_tags != nullptr && replacement.empty() && out.room() >= n) {
    std::size_t written = 0;
    i = strip_tags(p, n, out.tail(), &depth, &written);
    out.commit(written);
  }
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
