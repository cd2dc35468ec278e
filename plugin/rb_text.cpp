// rbText: one host string's text as ASCII, UTF-8, UTF-16 or UTF-32. Plain
// ASCII in an ASCII-compatible encoding is read in place; everything else is
// converted by the host and copied into a zero-terminated buffer the view
// owns. (The copy is made every time rather than peeking at the unit after
// the host's buffer, which the host does not promise to be readable; it also
// gives the 16- and 32-bit forms their natural alignment.)
#include "plugin/rb_text.h"

#include <cstdint>
#include <cstdlib>
#include <cstring>

#include "common/bytes.h"
#include "plugin/host_services.h"
#include "plugin/rb_data.h"
#include "plugin/results.h"

namespace {

alignas(8) const char EmptyBuffer[8] = {};
const std::uint16_t EmptyBufferUInt16[4] = {};
const std::uint32_t EmptyBufferUInt32[4] = {};

constexpr const void* kEmpty[] = {EmptyBuffer, EmptyBuffer, EmptyBufferUInt16, EmptyBufferUInt32};

// Encodings whose bytes below 0x80 are ASCII characters.
bool ascii_compatible(std::uint32_t e) {
  return e == text_encoding::kMacRoman || e == text_encoding::kLatin1 ||
         e == text_encoding::kWindowsLatin1 || e == text_encoding::kASCII ||
         e == text_encoding::kUTF8;
}

std::uint16_t swap16(std::uint16_t v) { return static_cast<std::uint16_t>((v >> 8) | (v << 8)); }
std::uint32_t swap32(std::uint32_t v) {
  return (v >> 24) | ((v >> 8) & 0xFF00) | ((v << 8) & 0xFF0000) | (v << 24);
}

}  // namespace

rbText::rbText(REALstring s) {
  for (int i = 0; i < kSlots; ++i) pointers_[i] = kEmpty[i];
  if (!s) return;
  REALLockString(s);
  string_ = s;
  for (auto& length : lengths_) length = -1;

  bool available = false;
  const std::uint32_t encoding = REALGetStringEncoding(s, &available);
  if (!available || ascii_compatible(encoding)) {
    rbData bytes(s);
    if (zul::all_ascii(bytes.bytes())) apply_ascii_shortcut();
  } else if (encoding == text_encoding::kUnknown) {
    rbData bytes(s);
    if (zul::all_ascii(bytes.bytes())) {
      apply_ascii_shortcut();
    } else {
      // Bytes without a declared encoding are read as Mac OS Roman: the view
      // swaps in a tagged copy and holds that copy's only reference.
      REALstring remade =
          REALBuildUnicodeString(bytes.data, bytes.length, text_encoding::kMacRoman);
      REALUnlockString(s);
      string_ = remade;
      if (!remade) {
        host_failed_ = true;
        for (int i = 0; i < kSlots; ++i) lengths_[i] = 0;
      }
    }
  }
}

rbText::~rbText() {
  if (string_) REALUnlockString(string_);
  for (int i = 0; i < kSlots; ++i) {
    std::free(owned_[i]);
    owned_[i] = nullptr;
  }
  string_ = nullptr;
}

void rbText::apply_ascii_shortcut() {
  is_ascii_ = true;
  std::int64_t n = 0;
  const std::uint8_t* bytes = REALGetStringContents(string_, &n);
  if (!bytes) n = 0;
  for (Slot slot : {kASCII, kUTF8}) {
    pointers_[slot] = bytes ? static_cast<const void*>(bytes) : kEmpty[slot];
    lengths_[slot] = n;
  }
}

void rbText::reset_slot(Slot slot) {
  std::free(owned_[slot]);
  owned_[slot] = nullptr;
  pointers_[slot] = kEmpty[slot];
  lengths_[slot] = 0;
}

namespace {

// A buffer for units of the given size, with four spare units after them
// set to zero (a terminating zero unit, and then some); the units themselves
// are left for the caller to write, not zero-filled first. Null when the
// count has no buffer size or a signed length cannot hold it (it may come
// from a length the host reports), or when memory runs out.
void* allocate_units(std::size_t units, std::size_t unit) {
  if (units > SIZE_MAX / unit - 4 || units > static_cast<std::uint64_t>(INT64_MAX)) return nullptr;
  void* buffer = std::malloc((units + 4) * unit);
  if (buffer) std::memset(static_cast<char*>(buffer) + units * unit, 0, 4 * unit);
  return buffer;
}

}  // namespace

bool rbText::take_copy(Slot slot, const void* src, std::size_t units, std::size_t unit) {
  reset_slot(slot);
  void* buffer = allocate_units(units, unit);
  if (!buffer) {
    out_of_memory_ = true;
    return false;
  }
  if (units) std::memcpy(buffer, src, units * unit);
  owned_[slot] = buffer;
  pointers_[slot] = buffer;
  lengths_[slot] = static_cast<std::int64_t>(units);
  return true;
}

template <class Unit>
void rbText::widen_ascii(Slot slot) {
  const std::int64_t n = LengthASCII();
  if (n < 1) return;
  auto* wide = static_cast<Unit*>(allocate_units(static_cast<std::size_t>(n), sizeof(Unit)));
  if (!wide) {
    out_of_memory_ = true;
    return;
  }
  const auto* bytes = static_cast<const std::uint8_t*>(pointers_[kASCII]);
  for (std::int64_t i = 0; i < n; ++i) wide[i] = bytes[i];
  owned_[slot] = wide;
  pointers_[slot] = wide;
  lengths_[slot] = n;
}

bool rbText::fetch(Slot slot, std::uint32_t encoding, std::size_t unit) {
  REALstringData record{};
  if (!REALGetStringData(string_, encoding, &record)) {
    host_failed_ = true;
    return false;
  }
  const std::size_t units = record.data ? static_cast<std::size_t>(record.length / unit) : 0;
  const bool copied = take_copy(slot, record.data, units, unit);
  REALDisposeStringData(&record);
  return copied;
}

void rbText::get_8bit(Slot slot, std::uint32_t encoding) {
  if (lengths_[slot] != -1) return;
  reset_slot(slot);
  if (string_) fetch(slot, encoding, 1);
}

const char* rbText::GetUTF8() {
  get_8bit(kUTF8, text_encoding::kUTF8);
  return static_cast<const char*>(pointers_[kUTF8]);
}

std::int64_t rbText::LengthUTF8() {
  get_8bit(kUTF8, text_encoding::kUTF8);
  return lengths_[kUTF8];
}

const char* rbText::GetASCII() {
  get_8bit(kASCII, text_encoding::kASCII);
  return static_cast<const char*>(pointers_[kASCII]);
}

std::int64_t rbText::LengthASCII() {
  get_8bit(kASCII, text_encoding::kASCII);
  return lengths_[kASCII];
}

void rbText::ConvertUTF16() {
  reset_slot(kUTF16);
  if (!string_) return;
  if (is_ascii_) {
    widen_ascii<std::uint16_t>(kUTF16);
    return;
  }
  if (!fetch(kUTF16, text_encoding::kUTF16, 2)) return;
  auto* units = static_cast<std::uint16_t*>(owned_[kUTF16]);
  std::int64_t n = lengths_[kUTF16];
  if (n >= 1 && units[0] == 0xFFFE) {
    for (std::int64_t i = 0; i < n; ++i) units[i] = swap16(units[i]);
  }
  if (n >= 1 && units[0] == 0xFEFF) ++units, --n;
  if (n >= 1 && units[0] == 0xFFFE) ++units, --n;
  pointers_[kUTF16] = units;
  lengths_[kUTF16] = n;
}

void rbText::ConvertUTF32() {
  reset_slot(kUTF32);
  if (!string_) return;
  if (is_ascii_) {
    widen_ascii<std::uint32_t>(kUTF32);
    return;
  }
  // A host that failed an earlier conversion is not trusted with UTF-32
  // either: the text is then derived from its UTF-16 form.
  const bool failed_before = host_failed_;
  if (!fetch(kUTF32, text_encoding::kUTF32, 4) || failed_before) derive_utf32_from_utf16();
  if (!owned_[kUTF32]) return;

  auto* units = static_cast<std::uint32_t*>(owned_[kUTF32]);
  std::int64_t n = lengths_[kUTF32];
  if (n >= 1 && units[0] == 0xFFFE0000u) {
    for (std::int64_t i = 0; i < n; ++i) units[i] = swap32(units[i]);
  }
  if (n >= 1 && units[0] == 0x0000FEFFu) ++units, --n;
  if (n >= 1 && units[0] == 0x0000FFFEu) ++units, --n;
  pointers_[kUTF32] = units;
  lengths_[kUTF32] = n;
}

void rbText::derive_utf32_from_utf16() {
  if (lengths_[kUTF16] == -1) ConvertUTF16();
  reset_slot(kUTF32);
  const std::int64_t n = lengths_[kUTF16];
  if (n < 1) return;
  // n is at most the UTF-16 slot's unit count, which take_copy bounded.
  auto* out = static_cast<std::uint32_t*>(allocate_units(static_cast<std::size_t>(n), 4));
  if (!out) {
    out_of_memory_ = true;
    return;
  }
  const auto* in = static_cast<const std::uint16_t*>(pointers_[kUTF16]);
  std::int64_t count = 0;
  for (std::int64_t i = 0; i < n; ++i) {
    const std::uint32_t unit = in[i];
    const bool high = unit >= 0xD800 && unit <= 0xDBFF;
    if (high && i + 1 < n && in[i + 1] >= 0xDC00 && in[i + 1] <= 0xDFFF) {
      out[count++] = 0x10000 + ((unit - 0xD800) << 10) + (in[i + 1] - 0xDC00);
      ++i;
    } else {
      out[count++] = unit;  // ordinary unit, or an unpaired surrogate kept as is
    }
  }
  // Pairs made fewer code points than units: zeros from the terminator on.
  std::memset(out + count, 0, static_cast<std::size_t>(n - count) * 4);
  owned_[kUTF32] = out;
  pointers_[kUTF32] = out;
  lengths_[kUTF32] = count;
  host_failed_ = false;
}
