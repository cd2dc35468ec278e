// ISO 8859-1 / Windows-1252 conversion cores. Both directions run the
// machine's block kernels (latin1_x86.cpp; the AVX-512 encoder with VBMI2
// in latin1_vbmi2.cpp) straight into the locked handle, sized once, and
// finish the tail with the scalar level here: one table look-up per byte
// when decoding; when encoding, ASCII words and then a reverse map derived
// at compile time from the same table (lowest byte first, as a search from
// index 0 would find, two look-ups per unit); tests compare it with a plain
// table search (tests/reference/latin1_reference.h). The vector kernels find
// the units from 0x100 up that a set holds through a perfect hash derived
// here too.
#include "text/latin1.h"

#include <algorithm>
#include <atomic>
#include <cstring>
#include <limits>
#include <stdexcept>

#include "text/latin1_kernels.h"

namespace zul::text {
namespace {

constexpr unsigned hash_slot(std::uint16_t unit, std::uint16_t multiplier) {
  return static_cast<std::uint16_t>(unit * multiplier) >> 10;
}

// Fills the hash of the units from 0x100 up with the smallest odd
// multiplier that gives each of them a slot of its own (the lowest byte
// wins where two bytes hold the same unit). A table for which there is none
// does not compile.
constexpr void derive_hash(const charset_table& table, single_byte_charset& set) {
  bool any = false;
  for (const std::uint16_t unit : table) any = any || unit >= 0x100;
  if (!any) return;
  for (unsigned m = 1; m < 0x10000; m += 2) {
    const auto multiplier = static_cast<std::uint16_t>(m);
    set.hash_units.fill(0);
    bool clash = false;
    for (int k = 0; k < 256 && !clash; ++k) {
      const std::uint16_t unit = table[k];
      if (unit < 0x100) continue;
      const unsigned slot = hash_slot(unit, multiplier);
      if (set.hash_units[slot] == unit) continue;
      clash = set.hash_units[slot] != 0;
      set.hash_units[slot] = unit;
      set.hash_bytes[slot] = static_cast<std::uint16_t>(k);
    }
    if (!clash) {
      set.hash_multiplier = multiplier;
      return;
    }
  }
  throw std::length_error("no perfect hash");
}

constexpr single_byte_charset derive_charset(const charset_table& table) {
  single_byte_charset set{&table, {}, {}, true, 0, {}, {}};
  for (auto& row : set.rows) row.fill(-1);
  set.row_of[0] = 1;
  std::size_t rows = 2;
  for (int k = 255; k >= 0; --k) {  // downwards, so the lowest byte is left
    const int high = table[k] >> 8;
    if (set.row_of[high] == 0) {
      // Not a constant expression, so a table too wide fails to compile.
      if (rows == single_byte_charset::kRows) throw std::length_error("too many high bytes");
      set.row_of[high] = static_cast<std::uint8_t>(rows++);
    }
    set.rows[set.row_of[high]][table[k] & 0xFF] = static_cast<std::int16_t>(k);
  }
  for (int k = 0; k < 0x80; ++k) set.ascii_identity = set.ascii_identity && set.low(k) == k;
  derive_hash(table, set);
  return set;
}

// Four UTF-16 units per 64-bit word: all below 0x80 when no lane has a bit
// of 0xFF80 set. The mask is the same in either byte order.
constexpr std::uint64_t kNonASCIILanes = 0xFF80FF80FF80FF80u;

// Copies the longest prefix of units[from..] made of whole words of ASCII
// units to out; returns the index of the first unit not copied.
std::size_t copy_ascii_words(std::span<const std::uint16_t> units, std::size_t from,
                             std::uint8_t* out) noexcept {
  std::size_t i = from;
  while (i + 4 <= units.size()) {
    std::uint64_t word;
    std::memcpy(&word, units.data() + i, sizeof word);
    if (word & kNonASCIILanes) break;
    out[0] = static_cast<std::uint8_t>(units[i]);
    out[1] = static_cast<std::uint8_t>(units[i + 1]);
    out[2] = static_cast<std::uint8_t>(units[i + 2]);
    out[3] = static_cast<std::uint8_t>(units[i + 3]);
    out += 4;
    i += 4;
  }
  return i;
}

// Shrinks out to count bytes (never fails: it stays within the block) or
// gives it up when nothing was written.
owned_handle finish(owned_handle out, std::size_t count) noexcept {
  if (count == 0) return {};
  set_handle_size(out.get(), count);
  return out;
}

// The scalar level: one look-up per byte; ASCII words, then one reverse
// look-up per unit. Both sets keep 00..7F and A0..FF as they are.
std::size_t decode_scalar(const std::uint8_t* in, std::size_t n, std::uint16_t* out,
                          const std::uint16_t* c1) noexcept {
  if (c1 == nullptr) {
    for (std::size_t i = 0; i < n; ++i) out[i] = in[i];
  } else {
    const std::uint16_t* table = c1 - 0x80;  // c1 is the row 80..9F of a full table
    for (std::size_t i = 0; i < n; ++i) out[i] = table[in[i]];
  }
  return n;
}

std::size_t encode_scalar(const std::uint16_t* in, std::size_t n, std::uint8_t* out,
                          const single_byte_charset& set, std::size_t* written) noexcept {
  const std::span<const std::uint16_t> units(in, n);
  std::size_t i = 0, o = 0;
  while (i < n) {
    const std::size_t next = copy_ascii_words(units, i, out + o);
    o += next - i;
    i = next;
    if (i == n) break;
    const int b = byte_for_unit(set, in[i++]);
    out[o] = static_cast<std::uint8_t>(b);  // kept only when b is a byte
    o += b >= 0;
  }
  *written = o;
  return n;
}

constexpr single_byte_kernels kScalarKernels{decode_scalar, encode_scalar};

}  // namespace

constinit const single_byte_charset kISO8859_1 = derive_charset(escapecharsISO8859);
constinit const single_byte_charset kWindows1252 = derive_charset(escapecharsCP1252);

// The block kernels rely on both sets keeping 00..7F and A0..FF as they are,
// with 80..9F either kept (ISO 8859-1) or taken from the table's C1 row.
static_assert(derive_charset(escapecharsISO8859).ascii_identity &&
              derive_charset(escapecharsCP1252).ascii_identity);

const simd::family_tables<single_byte_kernels>& single_byte_tables() noexcept {
  // Built once: the AVX-512 encoder compresses with VBMI2 where it has it.
  static const simd::family_tables<single_byte_kernels> tables = [] {
    simd::family_tables<single_byte_kernels> t{&kScalarKernels};
#if defined(__x86_64__)
    t.sse2 = &detail::kSingleByteSse2;
    t.avx2 = &detail::kSingleByteAvx2;
    t.avx512 =
        simd::has_avx512_vbmi2() ? &detail::kSingleByteAvx512Vbmi2 : &detail::kSingleByteAvx512;
#elif defined(__aarch64__)
    t.neon = &detail::kSingleByteNeon;
#endif
    return t;
  }();
  return tables;
}

const single_byte_kernels& single_byte_active() noexcept {
  static std::atomic<const single_byte_kernels*> cache{nullptr};
  return simd::active(single_byte_tables(), cache);
}

owned_handle decode_single_byte(std::span<const std::uint8_t> bytes, const single_byte_charset& set,
                                std::size_t limit, const single_byte_kernels& kernels) noexcept {
  if (bytes.empty() || bytes.size() > std::numeric_limits<std::size_t>::max() / 2) return {};
  owned_handle out(new_handle(2 * bytes.size(), limit));
  if (!out) return {};
  handle_lock lock(out.get());
  auto* units = reinterpret_cast<std::uint16_t*>(lock.data());
  const charset_table& table = *set.to_unicode;
  const std::uint16_t* c1 = table[0x80] == 0x80 ? nullptr : &table[0x80];
  const std::size_t done = kernels.decode(bytes.data(), bytes.size(), units, c1);
  decode_scalar(bytes.data() + done, bytes.size() - done, units + done, c1);
  return out;
}

owned_handle encode_single_byte(std::span<const std::uint16_t> units,
                                const single_byte_charset& set, std::size_t limit,
                                const single_byte_kernels& kernels) noexcept {
  if (units.empty()) return {};
  // At most one byte per unit, so the handle never has to grow.
  owned_handle out(new_handle(units.size(), limit));
  if (!out) return {};
  std::size_t count = 0;
  {
    handle_lock lock(out.get());
    std::size_t written = 0;
    const std::size_t done = kernels.encode(units.data(), units.size(), lock.data(), set, &written);
    std::size_t tail = 0;
    encode_scalar(units.data() + done, units.size() - done, lock.data() + written, set, &tail);
    count = written + tail;
  }
  return finish(std::move(out), count);
}

}  // namespace zul::text
