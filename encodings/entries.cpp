// Host adapters for the web, mail and database encodings: each reads its
// arguments (rbData for stored bytes, rbText for text in a known form),
// calls the pure worker and builds the host result with its encoding.
// Functions whose failures are reported run inside the shared trap; the
// others run inside the silent policy and give their empty result when a
// buffer cannot be had.
// Nothing here keeps state between calls, so calls from several threads
// are independent.
#include <cstdint>
#include <new>
#include <string>
#include <vector>

#include "encodings/html.h"
#include "encodings/html_tags.h"
#include "encodings/mail_subject.h"
#include "encodings/quoted_printable.h"
#include "encodings/sql.h"
#include "encodings/url.h"
#include "encodings/xml.h"
#include "encodings/yenc.h"
#include "plugin/exceptions.h"
#include "plugin/host_services.h"
#include "plugin/natives.h"
#include "plugin/rb_data.h"
#include "plugin/rb_text.h"
#include "plugin/results.h"

namespace enc = zul::encodings;
using namespace text_encoding;

namespace {

// The input string itself as the result: the caller owns one more reference.
REALstring same_string(REALstring s) {
  REALLockString(s);
  return s;
}

// The stored bytes of s through a byte decoder, as bytes without a declared
// encoding; no bytes give the null string.
template <class Decode>
REALstring decode_stored_bytes(REALstring s, Decode decode) {
  rbData in(s);
  if (in.length < 1) return nullptr;
  return build_string(decode(in.view()), kUnknown);
}

// fn of the code points of s; no characters give the null string.
template <class Fn>
REALstring with_code_points(REALstring s, Fn fn) {
  rbText text(s);
  text.ConvertUTF32();
  const auto chars = text.utf32();
  if (chars.empty()) return nullptr;
  return fn(chars);
}

REALstring build_utf32(const enc::code_points& text) {
  return REALBuildUnicodeString(text.data(), static_cast<std::int64_t>(text.size() * 4), kUTF32);
}

}  // namespace

// URL percent-encoding. Space and "+" follow this call's options only.
REALstring EncodingToURL2(REALstring s, std::int64_t options) noexcept {
  if (!s) return nullptr;
  return quietly<REALstring>(nullptr, [&] {
    rbData in(s);
    return build_string(enc::encode_url(in.view(), options), kASCII);
  });
}

REALstring EncodingToURL1(REALstring s) noexcept { return EncodingToURL2(s, 0); }

REALstring DecodingToURL2(REALstring s, std::int64_t options) noexcept {
  if (!s) return nullptr;
  return quietly<REALstring>(nullptr, [&] {
    return decode_stored_bytes(s,
                               [&](std::string_view in) { return enc::decode_url(in, options); });
  });
}

REALstring DecodingToURL1(REALstring s) noexcept { return DecodingToURL2(s, 0); }

// HTML character references over the string's code points.
REALstring EncodingToHTML(REALstring s, std::int64_t options) noexcept {
  if (!s) return nullptr;
  return trapped<REALstring>(nullptr, [&]() -> REALstring {
    rbText text(s);
    if (text.is_ascii()) {
      // ASCII text is its own code points: no widening to UTF-32 first.
      const zul::bytes_view ascii(reinterpret_cast<const std::uint8_t*>(text.GetASCII()),
                                  static_cast<std::size_t>(text.LengthASCII()));
      if (ascii.empty()) return nullptr;
      if (!enc::ascii_html_needs_escaping(ascii)) return same_string(s);
      return build_string(enc::encode_ascii_html(ascii, options), kASCII);
    }
    text.ConvertUTF32();
    const auto chars = text.utf32();
    if (chars.empty()) return nullptr;
    if (!enc::html_needs_escaping(chars)) return same_string(s);
    return build_string(enc::encode_html(chars, options), kASCII);
  });
}

// Registered as both "DecodingFromHTMLZUL" and "DecodingFromXMLZUL".
REALstring DecodingToHTML(REALstring s) noexcept {
  if (!s) return nullptr;
  return trapped<REALstring>(nullptr, [&] {
    return with_code_points(
        s, [](enc::code_point_view chars) { return build_utf32(enc::decode_html(chars)); });
  });
}

REALstring EncodingToXML(REALstring s, std::int64_t options) noexcept {
  if (!s) return nullptr;
  return trapped<REALstring>(nullptr, [&] {
    return with_code_points(s, [&](enc::code_point_view chars) {
      if (!enc::xml_needs_escaping(chars)) return same_string(s);
      return build_utf32(enc::encode_xml(chars, options));
    });
  });
}

// Ready means: empty, or stored as ASCII-compatible text and holding only
// bytes 1..127 other than the five markup characters. An empty string is
// ready whatever its encoding tag: there is nothing in it to escape.
static bool is_markup_ready(REALstring s) {
  if (!s) return true;
  rbData in(s);
  if (in.empty()) return true;
  bool available = false;
  const std::uint32_t encoding = REALGetStringEncoding(s, &available);
  if (available && encoding != kMacRoman && encoding != kWindowsLatin1 && encoding != kASCII &&
      encoding != kUTF8) {
    return false;
  }
  return enc::is_markup_free_ascii(in.view());
}

bool StringIsHTMLready(REALstring s) noexcept {
  return quietly(false, [&] { return is_markup_ready(s); });
}
bool StringIsXMLready(REALstring s) noexcept {
  return quietly(false, [&] { return is_markup_ready(s); });
}

// Quoted-printable over the stored bytes.
REALstring EncodingToQuotedPrintable2(REALstring s, std::int64_t line_length) noexcept {
  if (!s) return nullptr;
  return trapped<REALstring>(nullptr, [&] {
    rbData in(s);
    return build_string(enc::encode_quoted_printable(in.view(), line_length), kASCII);
  });
}

REALstring DecodingToQuotedPrintable(REALstring s) noexcept {
  if (!s) return nullptr;
  return trapped<REALstring>(nullptr, [&] {
    rbData in(s);
    return build_string(enc::decode_quoted_printable(in.view()), kASCII);
  });
}

// A subject of printable ASCII (the empty one included) comes back as it is.
// A subject the host cannot give as UTF-8 (a lone surrogate, odd-length
// UTF-16, invalid UTF-32) gives null: its stored bytes could not go into a
// mail header either.
REALstring EncodeEmailSubjectZUL(REALstring s) noexcept {
  if (!s) return nullptr;
  return trapped<REALstring>(nullptr, [&]() -> REALstring {
    rbText text(s);
    const std::string_view utf8 = text.utf8();
    if (text.host_failed()) return nullptr;
    if (text.out_of_memory()) throw std::bad_alloc();  // not the empty subject
    if (!enc::subject_needs_encoding(utf8)) return same_string(s);
    return build_string(enc::encode_mail_subject(utf8), kASCII);
  });
}

// yEnc data bytes.
REALstring yDecodeZULs(REALstring data) noexcept {
  if (!data) return nullptr;
  return quietly<REALstring>(nullptr, [&] { return decode_stored_bytes(data, enc::decode_yenc); });
}

REALmemoryBlock yDecodeZULm(REALmemoryBlock data) noexcept {
  if (!data) return nullptr;
  return quietly<REALmemoryBlock>(nullptr, [&]() -> REALmemoryBlock {
    rbData in(data);
    if (in.length < 1 || !in.data) return nullptr;
    const zul::out_buffer decoded = enc::decode_yenc(in.view());
    // The block builder raises its own exception when the block cannot be had.
    return REALNewMemoryBlock(static_cast<std::int64_t>(decoded.size()), decoded.data());
  });
}

// Tag removal over the UTF-8 text; the replacement is read as UTF-8 too. A
// text that could not be copied for want of memory is reported as such
// rather than read as empty (which would drop the replacement).
REALstring RemoveHTMLTagsWith(REALstring s, REALstring replacement) noexcept {
  if (!s) return nullptr;
  return trapped<REALstring>(nullptr, [&] {
    rbText text(s);
    rbText with(replacement);
    const std::string_view utf8 = text.utf8(), with_utf8 = with.utf8();
    if (text.out_of_memory() || with.out_of_memory()) throw std::bad_alloc();
    return build_string(enc::remove_html_tags(utf8, with_utf8), kUTF8);
  });
}

REALstring RemoveHTMLTags(REALstring s) noexcept { return RemoveHTMLTagsWith(s, nullptr); }

// SQL helpers.
REALstring DecodingFromMySQL(REALstring s) noexcept {
  if (!s) return nullptr;
  return quietly<REALstring>(nullptr, [&] {
    return decode_stored_bytes(s, [](std::string_view in) { return enc::decode_mysql(in); });
  });
}

REALstring SQLReplaceBooleanZUL(REALstring sql) noexcept {
  if (!sql) return nullptr;
  return quietly<REALstring>(nullptr, [&] {
    rbText text(sql);
    return build_string(enc::replace_sql_booleans(text.utf8()), kUTF8);
  });
}
