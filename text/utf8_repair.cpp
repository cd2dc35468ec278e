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

out_buffer repair_utf8(bytes_view bytes, std::string_view placeholder,
                       const simd::utf8_kernels& kernels) {
  const std::uint8_t* const p = bytes.data();
  const std::size_t n = bytes.size();
  out_buffer out(n > kResultLimit ? kResultLimit : n + 4096);
  // Placeholders of up to four bytes are written as one fixed four-byte
  // store (the room below allows for the overhang).
  const std::size_t ph_size = placeholder.size();
  std::uint8_t ph4[4] = {};
  if (ph_size <= 4) std::memcpy(ph4, placeholder.data(), ph_size);
  const std::size_t per_byte = ph_size > 4 ? ph_size : 4;  // most output per input byte
  std::size_t i = 0;
  std::size_t kernel_from = 0;  // the kernel runs again from this offset
  while (i < n) {
    if (i >= kernel_from && n - i >= kBlock) {
      out.ensure(n - i);  // the kernel may write whole blocks up to the end
      const std::size_t got = kernels.copy_valid(p + i, n - i, out.tail());
      out.commit(got);
      i += got;
      if (got == 0) kernel_from = i + kScalarStretch;
    }
    // Byte rules from i: up to the first fault when the kernel may resume,
    // through every fault of the stretch otherwise.
    const bool stretch = i < kernel_from;
    std::size_t limit = stretch ? kernel_from : i + kBlock;
    if (limit > n) limit = n;
    out.ensure((limit - i + 3) * per_byte);
    std::uint8_t* const first = out.tail();
    std::uint8_t* o = first;
    while (i < limit) {
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
      if (ph_size <= 4) {
        std::memcpy(o, ph4, 4);
      } else {
        std::memcpy(o, placeholder.data(), ph_size);
      }
      o += ph_size;
      ++i;
      if (!stretch) break;
    }
    out.commit(static_cast<std::size_t>(o - first));
  }
  return out;
}

}  // namespace zul::text
