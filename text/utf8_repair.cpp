// UTF-8 repair in one forward pass. The block kernel proves whole blocks
// well formed and copies them to the output as it goes; where it stops, the
// byte rules walk on to the faulty byte, which alone takes the placeholder,
// and the block kernel resumes after it. On data dense with faults (a kernel
// call that gets nothing) the byte rules carry on alone for a stretch, so
// random bytes do not pay a block check per fault. Tests compare it with a
// per-position reference (tests/reference/utf8_repair_reference.h).
#include "text/utf8_repair.h"

#include <cstring>

namespace zul::text {
namespace {

constexpr std::size_t kBlock = 64;           // least progress that makes a kernel call pay
constexpr std::size_t kScalarStretch = 256;  // scalar-only bytes after a short kernel call

bool in(std::uint8_t c, std::uint8_t low, std::uint8_t high) { return c >= low && c <= high; }

}  // namespace

std::size_t well_formed_prefix(bytes_view bytes) noexcept {
  return utf8_scan(bytes.data(), 0, bytes.size(), bytes.size());
}

out_buffer repair_utf8(bytes_view bytes, std::string_view placeholder, std::uint64_t limit,
                       const simd::utf8_kernels& kernels) {
  const std::uint8_t* const p = bytes.data();
  const std::size_t n = bytes.size();
  const std::size_t ph_size = placeholder.size();
  // The worst case (every byte replaced) reserved once, capped at the
  // limit, plus room for the kernels' whole-block and four-byte stores.
  const std::size_t worst = worst_case_reserve(n, ph_size > 1 ? ph_size : 1, 4096, limit);
  out_buffer out(worst + out_buffer::kSlack, limit);
  // Placeholders of up to four bytes are written as one fixed four-byte
  // store (the room below allows for the overhang); longer ones get room of
  // their own.
  const bool short_ph = ph_size <= 4;
  std::uint8_t ph4[4] = {};
  if (short_ph) std::memcpy(ph4, placeholder.data(), ph_size);
  std::size_t i = 0;
  std::size_t kernel_from = 0;  // the kernel runs again from this offset
  while (i < n) {
    if (i >= kernel_from && n - i >= kBlock) {
      // The kernel may write whole blocks up to the end of its input, so it
      // gets no more input than the room there is (or than kSlack).
      std::size_t chunk = n - i;
      if (chunk > out.room()) {
        if (chunk > out_buffer::kSlack) chunk = out_buffer::kSlack;
        if (!out.ensure(chunk)) return out.discard();
      }
      const std::size_t got = kernels.copy_valid(p + i, chunk, out.tail());
      out.commit(got);
      i += got;
      if (got == 0) kernel_from = i + kScalarStretch;
    }
    // Byte rules from i: up to the first fault when the kernel may resume,
    // through every fault of the stretch otherwise.
    const bool stretch = i < kernel_from;
    std::size_t stop = stretch ? kernel_from : i + 2 * kBlock;
    if (stop > n) stop = n;
    if (!out.ensure((stop - i + 3) * 4)) return out.discard();
    std::uint8_t* o = out.tail();
    while (i < stop) {
      const std::uint8_t c = p[i];
      if (c < 0x80) {
        *o++ = c;
        ++i;
        continue;
      }
      const utf8_lead row = kUtf8Leads[c];
      if (row.length != 0 && n - i >= row.length && in(p[i + 1], row.second_low, row.second_high) &&
          (row.length < 3 || (p[i + 2] & 0xC0) == 0x80) &&
          (row.length < 4 || (p[i + 3] & 0xC0) == 0x80)) {
        std::memcpy(o, p + i, row.length);
        o += row.length;
        i += row.length;
        continue;
      }
      ++i;
      if (short_ph) {
        std::memcpy(o, ph4, 4);
        o += ph_size;
      } else {
        out.commit(static_cast<std::size_t>(o - out.tail()));
        if (!out.ensure(ph_size + (stop - i + 3) * 4)) return out.discard();
        out.put(placeholder);
        o = out.tail();
      }
      if (!stretch) break;
    }
    out.commit(static_cast<std::size_t>(o - out.tail()));
  }
  if (!out.fits()) return out.discard();
  return out;
}

}  // namespace zul::text
