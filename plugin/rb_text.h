// rbText: a view of one host string's text as ASCII, UTF-8, UTF-16 or UTF-32,
// whatever encoding the string is stored in. Plain-ASCII strings in an
// ASCII-compatible encoding are read in place with no conversion; otherwise
// the host converts ("PluginGetStringData") and the view keeps each form for
// its life. Every buffer it hands out ends with a zero unit; UTF-16 and
// UTF-32 forms lose a leading byte-order mark (and are byte-swapped first
// when the mark says the other byte order). Failures give empty texts.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "plugin/host_types.h"

class rbText {
 public:
  explicit rbText(REALstring s);  // s may be null: every form is then empty
  ~rbText();
  rbText(const rbText&) = delete;
  rbText& operator=(const rbText&) = delete;

  const char* GetUTF8();
  std::int64_t LengthUTF8();
  const char* GetASCII();
  std::int64_t LengthASCII();
  std::string_view utf8() {
    const char* p = GetUTF8();
    return {p, static_cast<std::size_t>(LengthUTF8())};
  }
  std::string_view ascii() {
    const char* p = GetASCII();
    return {p, static_cast<std::size_t>(LengthASCII())};
  }

  // Compute the UTF-16 / UTF-32 forms; read them with utf16() / utf32().
  void ConvertUTF16();
  void ConvertUTF32();
  std::span<const std::uint16_t> utf16() const {
    return {static_cast<const std::uint16_t*>(pointers_[kUTF16]), len(kUTF16)};
  }
  std::span<const std::uint32_t> utf32() const {
    return {static_cast<const std::uint32_t*>(pointers_[kUTF32]), len(kUTF32)};
  }

  bool is_ascii() const { return is_ascii_; }
  // True when the host could not give the text in a form asked for (the
  // form then reads as empty text).
  bool host_failed() const { return host_failed_; }
  // True once a form could not be copied or widened for want of memory (it
  // then reads as empty text): for callers that report failed allocations.
  bool out_of_memory() const { return out_of_memory_; }

 private:
  enum Slot { kASCII = 0, kUTF8 = 1, kUTF16 = 2, kUTF32 = 3, kSlots = 4 };

  std::size_t len(Slot slot) const {
    return lengths_[slot] > 0 ? static_cast<std::size_t>(lengths_[slot]) : 0;
  }
  void get_8bit(Slot slot, std::uint32_t encoding);
  // Asks the host for the text in encoding and copies it into an owned,
  // zero-terminated buffer of the slot (unit bytes per unit).
  bool fetch(Slot slot, std::uint32_t encoding, std::size_t unit);
  bool take_copy(Slot slot, const void* src, std::size_t units, std::size_t unit);
  void reset_slot(Slot slot);
  // Widens the ASCII slot's bytes to units of Unit in the slot (empty when
  // there are none or no buffer can be had).
  template <class Unit>
  void widen_ascii(Slot slot);
  void apply_ascii_shortcut();
  void derive_utf32_from_utf16();

  REALstring string_ = nullptr;
  std::int64_t lengths_[kSlots] = {0, 0, 0, 0};
  const void* pointers_[kSlots];
  void* owned_[kSlots] = {nullptr, nullptr, nullptr, nullptr};
  bool is_ascii_ = false;
  bool host_failed_ = false;
  bool out_of_memory_ = false;
};
