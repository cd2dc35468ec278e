// Host adapters for byte-order marks, encoding normalisation, ISO 8859-1 /
// Windows-1252 conversion and number formatting: each reads its arguments
// (rbData for stored bytes, rbText for UTF-16 text), calls the pure worker
// and builds the host result, all inside the silent policy: none of them
// reports failures, and a buffer that cannot be had gives the null string.
// Nothing here keeps state between calls, so calls from several threads are
// independent.
#include <cstdint>

#include "plugin/exceptions.h"
#include "plugin/host_services.h"
#include "plugin/natives.h"
#include "plugin/rb_data.h"
#include "plugin/rb_text.h"
#include "plugin/results.h"
#include "text/handles.h"
#include "text/latin1.h"
#include "text/markers.h"
#include "text/number_format.h"

namespace txt = zul::text;
using namespace text_encoding;

namespace {

// The host string of a handle's bytes; the handle stays locked while the
// host copies them. A null handle gives the null string.
REALstring build_from_handle(const txt::owned_handle& h, std::uint32_t encoding) {
  if (!h) return nullptr;
  txt::handle_lock lock(h.get());
  return REALBuildUnicodeString(lock.data(), static_cast<std::int64_t>(h.size()), encoding);
}

// Bytes as stored, read as the character set: UTF-16 units for the host,
// which hands them back as a UTF-8 string.
REALstring decoding_to(REALstring s, const txt::single_byte_charset& set) {
  if (!s) return nullptr;
  rbData in(s);
  return build_from_handle(txt::decode_single_byte(in.bytes(), set), kUTF16);
}

// Any text, read as UTF-16, as bytes of the character set. The bytes carry
// no declared encoding unless they are all ASCII.
REALstring encoding_to(REALstring s, const txt::single_byte_charset& set) {
  if (!s) return nullptr;
  rbText text(s);
  text.ConvertUTF16();
  return build_from_handle(txt::encode_single_byte(text.utf16(), set), kUnknown);
}

// The host's own conversion of s. An empty string gives the null string,
// like the null string itself, without asking the host.
REALstring host_conversion(REALstring s, std::uint32_t encoding) {
  if (!s) return nullptr;
  {
    rbData in(s);
    if (in.length < 1) return nullptr;
  }
  return REALConvertString(s, encoding);
}

std::uint32_t encoding_of(txt::marker_form form) {
  switch (form) {
    case txt::marker_form::utf8:
      return kUTF8;
    case txt::marker_form::utf16:
      return kUTF16;
    case txt::marker_form::utf32:
      return kUTF32;
  }
  return kUnknown;
}

}  // namespace

std::int64_t DetectUnicodeMarkers(REALstring s) noexcept {
  return quietly<std::int64_t>(0, [&]() -> std::int64_t {
    if (!s) return 0;
    rbData in(s);
    return txt::detect_unicode_marker(in.bytes());
  });
}

REALstring GetUnicodeMarkers(std::int64_t kind) noexcept {
  return quietly<REALstring>(nullptr, [&]() -> REALstring {
    const auto marker = txt::unicode_marker_for(kind);
    if (!marker) return nullptr;
    return build_string(marker->bytes, encoding_of(marker->form));
  });
}

REALstring RBUnicodeString(REALstring s) noexcept {
  return quietly<REALstring>(nullptr, [&] { return host_conversion(s, kUTF16); });
}
REALstring RBNativeString(REALstring s) noexcept {
  return quietly<REALstring>(nullptr, [&] { return host_conversion(s, kUTF8); });
}

REALstring DecodingToISO8859(REALstring s) noexcept {
  return quietly<REALstring>(nullptr, [&] { return decoding_to(s, txt::kISO8859_1); });
}
REALstring EncodingToISO8859(REALstring s) noexcept {
  return quietly<REALstring>(nullptr, [&] { return encoding_to(s, txt::kISO8859_1); });
}
REALstring DecodingToCP1252(REALstring s) noexcept {
  return quietly<REALstring>(nullptr, [&] { return decoding_to(s, txt::kWindows1252); });
}
REALstring EncodingToCP1252(REALstring s) noexcept {
  return quietly<REALstring>(nullptr, [&] { return encoding_to(s, txt::kWindows1252); });
}

REALstring ScientificStrZUL(double d, std::int64_t digits) noexcept {
  return quietly<REALstring>(
      nullptr, [&] { return build_string(txt::format_scientific(d, digits).view(), kASCII); });
}

REALstring StrZUL(double d) noexcept {
  return quietly<REALstring>(nullptr,
                             [&] { return build_string(txt::format_plain(d).view(), kASCII); });
}
