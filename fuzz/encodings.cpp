// Fuzz target for the web, mail and database codecs. The first byte picks
// the function and its options; the rest is the input.
// Invariants:
//  1. no crash, no read outside the input (run under the sanitizers);
//  2. every decoder accepts every byte sequence;
//  3. fast paths equal their scalar references (URL, HTML, XML,
//     quoted-printable, yEnc, tag removal, SQL booleans), at every kernel
//     level the machine has;
//  4. decode(encode(x)) == x for URL with options 0 to 2, and for
//     quoted-printable text without line breaks (those become CR LF / LF).
#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>
#include <vector>

#include "encodings/html.h"
#include "encodings/html_tags.h"
#include "encodings/quoted_printable.h"
#include "encodings/sql.h"
#include "encodings/url.h"
#include "encodings/xml.h"
#include "encodings/yenc.h"
#include "fuzz/fuzz_check.h"
#include "tests/reference/html_reference.h"
#include "tests/reference/html_tags_reference.h"
#include "tests/reference/quoted_printable_reference.h"
#include "tests/reference/sql_reference.h"
#include "tests/reference/url_reference.h"
#include "tests/reference/xml_reference.h"
#include "tests/reference/yenc_reference.h"

using zul_fuzz::check;
namespace enc = zul::encodings;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size < 1) return 0;
  const std::uint8_t pick = data[0];
  const std::string_view in(reinterpret_cast<const char*>(data + 1), size - 1);
  const std::int64_t options = pick >> 4;
  switch (pick % 6) {
    case 0:
      for (const zul::simd::isa level : zul::simd::supported_isas()) {
        const zul::out_buffer encoded =
            enc::encode_url(in, options, zul::kMaxResultBytes, zul::scan_for(level));
        check(encoded == zul::reference::encode_url_reference(in, options));
        if ((options & 3) < 3) check(enc::decode_url(encoded, options, zul::scan_for(level)) == in);
      }
      break;
    case 1:
      for (const zul::simd::isa level : zul::simd::supported_isas()) {
        check(enc::decode_url(in, options, zul::scan_for(level)) ==
              zul::reference::decode_url_reference(in, options));
      }
      break;
    case 2: {
      // One code point per input byte (U+0000..U+00FF, read unsigned), or
      // with options bit 1 one per three bytes, anywhere up to U+10FFFF.
      std::vector<std::uint32_t> text;
      const std::uint8_t* p = data + 1;
      if (options & 2) {
        for (std::size_t k = 0; k + 3 <= in.size(); k += 3) {
          text.push_back((p[k] << 16 | p[k + 1] << 8 | p[k + 2]) % 0x110000);
        }
      } else {
        text.assign(p, p + in.size());
      }
      const std::string html = zul::reference::encode_html_reference(text, options);
      const enc::code_points decoded = zul::reference::decode_html_reference(text);
      const enc::code_points xml = zul::reference::encode_xml_reference(text, options);
      for (const zul::simd::isa level : zul::simd::supported_isas()) {
        const zul::scan_kernels& scan = zul::scan_for(level);
        check(enc::encode_html(text, options, zul::kMaxResultBytes, scan) == html);
        check(enc::decode_html(text, enc::kMaxResultCodePoints, scan) == decoded);
        check(enc::encode_xml(text, options, enc::kMaxResultCodePoints, scan) == xml);
      }
      break;
    }
    case 3:
      check(enc::decode_yenc(in) == zul::reference::decode_yenc_reference(in));
      break;
    case 4: {
      std::string flat(in);
      std::erase_if(flat, [](char c) { return c == '\r' || c == '\n'; });
      check(enc::decode_quoted_printable(enc::encode_quoted_printable(flat, 4 + options * 8)) ==
            flat);
      const std::string encoded =
          zul::reference::encode_quoted_printable_reference(in, 4 + options * 8);
      const std::string decoded = zul::reference::decode_quoted_printable_reference(in);
      for (const zul::simd::isa level : zul::simd::supported_isas()) {
        const zul::scan_kernels& scan = zul::scan_for(level);
        check(enc::encode_quoted_printable(in, 4 + options * 8, zul::kMaxResultBytes, scan) ==
              encoded);
        check(enc::decode_quoted_printable(in, scan) == decoded);
      }
      break;
    }
    default:
      for (const zul::simd::isa level : zul::simd::supported_isas()) {
        check(enc::decode_mysql(in, level) == zul::reference::decode_mysql_reference(in));
      }
      for (const zul::simd::isa level : zul::simd::supported_isas()) {
        const std::string_view with = options & 1 ? "?" : "";
        check(enc::remove_html_tags(in, with, zul::kMaxResultBytes, level) ==
              zul::reference::remove_html_tags_reference(in, with));
      }
      for (const zul::simd::isa level : zul::simd::supported_isas()) {
        check(enc::replace_sql_booleans(in, enc::detail::sql_kernels_for(level)) ==
              zul::reference::replace_sql_booleans_reference(in));
      }
      break;
  }
  return 0;
}
