// Host adapters for UTF-8 repair and byte classes. CheckUTF8ZUL reads its
// bytes from a pointer, a memory block or a string (kept locked while the
// repair runs) and its placeholder as UTF-8 through rbText; the repair runs
// inside the shared trap, so running out of memory raises
// "OutOfMemoryException". The byte-class functions read stored bytes through
// rbData and report nothing.
#include <cstdint>
#include <string>
#include <string_view>

#include "common/size_gate.h"
#include "plugin/exceptions.h"
#include "plugin/natives.h"
#include "plugin/rb_data.h"
#include "plugin/rb_text.h"
#include "plugin/results.h"
#include "text/char_class.h"
#include "text/utf8_repair.h"

using namespace text_encoding;

namespace {

// The shared core of the three CheckUTF8ZUL overloads, run inside the trap.
// No bytes (null data, size 0 or negative) give the null string without
// reading the placeholder.
REALstring CheckUTF8(const void* data, std::int64_t size, REALstring placeholder) {
  if (!data || size <= 0) return nullptr;
  rbText ph(placeholder);
  std::string_view text = ph.utf8();
  text = text.substr(0, text.find('\0'));  // the placeholder ends at its first zero byte
  const zul::out_buffer out = zul::text::repair_utf8(
      {static_cast<const std::uint8_t*>(data), static_cast<std::size_t>(size)}, text);
  return build_string(out.view(), kUTF8);
}

}  // namespace

REALstring CheckUTF8p(void* data, std::int64_t size, REALstring placeholder) noexcept {
  return trapped<REALstring>(nullptr, [&] { return CheckUTF8(data, size, placeholder); });
}

REALstring CheckUTF8m(REALmemoryBlock mem, REALstring placeholder) noexcept {
  return trapped<REALstring>(nullptr, [&] {
    rbData block(mem);
    return CheckUTF8(block.data, block.length, placeholder);
  });
}

REALstring CheckUTF8s(REALstring data, REALstring placeholder) noexcept {
  return trapped<REALstring>(nullptr, [&] {
    rbData bytes(data);
    return CheckUTF8(bytes.data, bytes.length, placeholder);
  });
}

// Failures are silent here: a buffer that cannot be had gives the null string.
REALstring ReplaceNonPrintableCharactersZUL(REALstring s, std::int64_t replace_value) noexcept {
  return quietly<REALstring>(nullptr, [&]() -> REALstring {
    rbData bytes(s);
    if (bytes.empty() || !zul::fits_result(bytes.bytes().size())) return nullptr;
    const zul::out_buffer out = zul::text::replace_non_printable(
        bytes.bytes(), static_cast<std::uint8_t>(replace_value & 0xFF));
    return build_string(out, kASCII);
  });
}

bool IsASCIIString1(REALstring s) noexcept {
  return quietly(false, [&] {
    rbData bytes(s);
    return zul::text::all_bytes_in(bytes.bytes(), zul::text::byte_class::seven_bit);
  });
}

bool IsASCIIString2(REALstring s, std::int64_t mode) noexcept {
  return quietly(false, [&] {
    const std::optional<zul::text::byte_class> cls = zul::text::byte_class_for_mode(mode);
    if (!cls) return false;
    rbData bytes(s);
    return zul::text::all_bytes_in(bytes.bytes(), *cls);
  });
}
