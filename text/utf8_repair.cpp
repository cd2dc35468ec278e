// UTF-8 repair in one forward pass. The block kernel proves whole blocks
// well formed and copies them to the output as it goes; where it stops, the
// byte rules walk on to the faulty byte, which alone takes the placeholder,
// and the block kernel resumes after it. On data dense with faults (a kernel
// call that gets nothing) a stretch follows without block checks: where the
// level has them, keep masks mark every byte that lies inside a well-formed
// sequence and the writer replaces the rest a block at a time; otherwise
// the byte rules carry on alone. Tests compare it with a per-position
// reference (tests/reference/utf8_repair_reference.h).
#include "text/utf8_repair.h"

#include <array>
#include <bit>
#include <cstring>

namespace zul::text {
namespace {

constexpr std::size_t kBlock = 64;           // least progress that makes a kernel call pay
constexpr std::size_t kScalarStretch = 256;  // bytes without block checks after a short kernel call
constexpr std::size_t kDenseBlocks = kScalarStretch / kBlock;

bool in(std::uint8_t c, std::uint8_t low, std::uint8_t high) { return c >= low && c <= high; }

// Byte k of entry m is FF where bit k of m is set: eight mask bits as a
// byte mask for a little-endian word of eight bytes.
constexpr std::array<std::uint64_t, 256> kSpread = [] {
  std::array<std::uint64_t, 256> t{};
  for (int m = 0; m < 256; ++m) {
    for (int k = 0; k < 8; ++k) {
      if ((m >> k) & 1) t[m] |= std::uint64_t{0xFF} << (8 * k);
    }
  }
  return t;
}();

// Writes blocks of 64 bytes from in with every byte whose keep bit is clear
// replaced by placeholder; returns the new end of the output. Room for
// 64 * max(placeholder size, 1) + 32 bytes per block is needed.
std::uint8_t* write_kept(const std::uint8_t* in, const std::uint64_t* keep, std::size_t blocks,
                         std::string_view placeholder, std::uint8_t* o) {
  const std::size_t ph_size = placeholder.size();
  if (ph_size == 1 && std::endian::native == std::endian::little) {
    // One byte for one byte: a select per word of eight.
    const std::uint64_t ph8 = 0x0101010101010101ull * static_cast<std::uint8_t>(placeholder[0]);
    for (std::size_t b = 0; b < blocks; ++b) {
      for (std::size_t j = 0; j < 8; ++j) {
        const std::uint64_t kept = kSpread[(keep[b] >> (8 * j)) & 0xFF];
        std::uint64_t w;
        std::memcpy(&w, in + 64 * b + 8 * j, 8);
        w = (w & kept) | (ph8 & ~kept);
        std::memcpy(o, &w, 8);
        o += 8;
      }
    }
    return o;
  }
  std::uint8_t ph4[4] = {};
  if (ph_size <= 4) std::memcpy(ph4, placeholder.data(), ph_size);
  // The block and 16 bytes of overrun, so that runs copy in fixed chunks.
  std::uint8_t block[64 + 16];
  for (std::size_t b = 0; b < blocks; ++b) {
    std::memcpy(block, in + 64 * b, 64);
    std::uint64_t bad = ~keep[b];
    std::size_t from = 0;
    for (;;) {
      const std::size_t to = bad != 0 ? static_cast<std::size_t>(__builtin_ctzll(bad)) : 64;
      for (std::size_t k = from; k < to; k += 16) std::memcpy(o + (k - from), block + k, 16);
      o += to - from;
      if (to == 64) break;
      if (ph_size <= 4) {
        std::memcpy(o, ph4, 4);
      } else {
        std::memcpy(o, placeholder.data(), ph_size);
      }
      o += ph_size;
      from = to + 1;
      bad &= bad - 1;
    }
  }
  return o;
}

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
  // Blocks per keep-mask call: as many as fit in a stretch, fewer where a
  // long placeholder would ask for more room than one request may.
  const std::size_t dense_room = kBlock * (ph_size > 1 ? ph_size : 1) + 32;
  std::size_t dense_blocks = kernels.keep_masks == nullptr ? 0 : kDenseBlocks;
  while (dense_blocks != 0 && dense_blocks * dense_room > out_buffer::kSlack) --dense_blocks;
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
    const bool stretch = i < kernel_from;
    if (dense_blocks != 0 && (stretch || kernels.block == kBlock) && n - i >= kBlock + 3) {
      // Whole blocks by keep masks: those of the stretch, or the one the
      // kernel stopped in when its blocks are as long (a shorter block's
      // fault costs less by the byte rules). The sequence that the last one
      // leaves open is copied too, so i stays on a boundary.
      std::size_t blocks = (n - i - 3) / kBlock;
      const std::size_t most = stretch ? dense_blocks : 1;
      if (blocks > most) blocks = most;
      std::uint64_t keep[kDenseBlocks];
      const std::size_t overhang = kernels.keep_masks(p + i, blocks, keep);
      if (!out.ensure(blocks * dense_room)) return out.discard();
      std::uint8_t* o = write_kept(p + i, keep, blocks, placeholder, out.tail());
      i += blocks * kBlock;
      std::memcpy(o, p + i, 3);  // at least 3 bytes follow the blocks
      out.commit(static_cast<std::size_t>(o - out.tail()) + overhang);
      i += overhang;
      continue;
    }
    // Byte rules from i: up to the first fault when the kernel may resume,
    // through every fault of the stretch otherwise.
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
