// One table of calls covering all 64 registered functions with several
// inputs each, for the tests that call everything through the stand-in host
// (allocation failures, threads). Each case calls its declaration and
// reports what it gave as text, and whether that is the empty result.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "tests/declarations.h"
#include "tests/host_fixture.h"

namespace all_functions {

using namespace std::string_view_literals;
using namespace text_encoding;
using zul_host::Block;
using zul_host::Host;
using zul_host::Str;
using zul_host::StrArray;
using zul_host::tagged;
using zul_host::utf8;

// What a call gave, as text, and whether it is the function's empty result.
struct outcome {
  std::string text;
  bool empty = false;
};
inline outcome seen(const Str& s) {
  return {s.null ? "null" : s.bytes + "/" + std::to_string(s.encoding), s.null};
}
inline outcome seen(const Block& b) { return {b.null ? "null" : b.bytes, b.null}; }
inline outcome seen(const StrArray& a) {
  std::string text = a.null ? "null" : "";
  for (const Str& s : a.items) text += s.bytes + "|";
  return {text, a.null};
}
// Numbers have no empty result of their own: a text view that could not be
// made reads as empty text (and nothing is raised), which changes the value.
inline outcome seen(std::int64_t v) { return {std::to_string(v), true}; }
inline outcome seen(double v) { return {std::to_string(v), true}; }
inline outcome seen(bool v) { return {v ? "true" : "false", true}; }

struct function_case {
  int row;
  std::function<outcome(Host&)> call;
};

template <class R, class... A>
inline function_case make(int row, A... args) {
  return {row, [row, args...](Host& host) { return seen(host.call<R>(decl(row), args...)); }};
}

// Random bytes differ on every call: only their length is compared.
inline function_case random_bytes(bool ascii) {
  return {14, [ascii](Host& host) {
            const Str s = host.call<Str>(decl(14), std::int64_t{16}, ascii);
            return outcome{s.null ? "null" : std::to_string(s.bytes.size()), s.null};
          }};
}

inline std::vector<function_case> cases() {
  const Str a = utf8("hello, w\xC3\xB6rld <&> \"it's\" caf\xC3\xA9");
  const Str latin = tagged("Caf\xE9 <b>", kLatin1), u16 = utf16(u"Gr\u00FC\u00DFe \U0001F600");
  const Str bad = tagged(
                "a\xFF"
                "b\xC3\xA9\xFE",
                kUnknown),
            empty = utf8(""), none = {{}, kUTF8, true};
  const Str hex = utf8("48656c6C6f7"), sql = utf8("select TRUE, 'true' where false");
  const Str tags = utf8("<p>x<b>y</b></p>z"), qp = utf8("a=3Db=\r\nc =C3=A9\r\n");
  const Str refs = utf8("&lt;&eacute;&#128512;&amp"), yenc = utf8("rst*=@=}");
  const Str runs = tagged("ab\x01hello world\xFF\xC3\xA9t\xC3\xA9\0xyz"sv, kUnknown);
  static const std::string raw_runs = "\x01readable text\x02\xC3\xA9t\xC3\xA9 more\xFF";
  const void* raw = raw_runs.data();
  const std::int64_t n = static_cast<std::int64_t>(raw_runs.size()), k0 = 0, k1 = 1, k2 = 2, k3 = 3,
                     k4 = 4, k16 = 16, k72 = 72, k255 = 255;
  const Block block{raw_runs}, yblock{"rstuvw=@"};
  std::vector<function_case> c = {
      make<StrArray>(1, raw, n, k0),
      make<StrArray>(1, raw, n, k4),
      make<StrArray>(2, block, k1),
      make<StrArray>(3, runs, k2),
      make<StrArray>(3, a, k0),
      make<Str>(4, raw, n, utf8("?")),
      make<Str>(5, block, utf8("<?>")),
      make<Str>(6, bad, utf8("?")),
      make<Str>(6, a, empty),
      make<Str>(7, a),
      make<Str>(7, u16),
      make<Str>(7, latin),
      make<Block>(8, yblock),
      make<Str>(9, yenc),
      make<double>(10, a, latin),
      make<double>(10, u16, utf8("Grusse")),
      make<double>(11, a, latin),
      make<double>(11, u16, a),
      make<Str>(12, 1234.5678, k3),
      make<Str>(12, -1e300, k16),
      make<Str>(13, 0.1),
      make<Str>(13, -123456789.125),
      random_bytes(false),
      random_bytes(true),
      make<Str>(15, std::int64_t{37}, utf8("abc")),
      make<Str>(15, k4, none),
      make<std::int64_t>(16, a, latin),
      make<std::int64_t>(17, a, latin),
      make<std::int64_t>(17, u16, a),
      make<std::int64_t>(18, a, utf8("l")),
      make<std::int64_t>(19, tagged("\xEF\xBB\xBFx", kUnknown)),
      make<Str>(20, k1),
      make<Str>(20, k3),
      make<bool>(21, a),
      make<bool>(22, utf8("plain")),
      make<Str>(23, a, utf8("\x5F")),
      make<Str>(24, a, utf8(" ")),
      make<Str>(25, a, utf8("key"), k1),
      make<Str>(26, a, utf8("key"), -k1),
      make<Str>(27, a),
      make<Str>(27, latin),
      make<Str>(28, u16),
      make<Str>(28, latin),
      make<Str>(29, utf8("It\\'s \\\\n\\Z")),
      make<Str>(30, a, k0),
      make<Str>(30, u16, k1),
      make<Str>(31, refs),
      make<Str>(32, a, k1),
      make<Str>(32, latin, k0),
      make<Str>(33, refs),
      make<Str>(34, a),
      make<Str>(35, a, k1),
      make<Str>(36, utf8("a%20b+c%FF")),
      make<Str>(37, utf8("a%20b+c"), k1),
      make<Str>(38, a, k16),
      make<Str>(38, latin, k72),
      make<Str>(39, qp),
      make<Str>(40, a, k2, k4, utf8("> "), utf8("\n"), utf8(" "), utf8("")),
      make<Str>(40, bad, k3, k3, empty, utf8(";"), utf8(","), utf8("xy")),
      make<Str>(41, a),
      make<Str>(41, u16),
      make<Str>(42, latin),
      make<Str>(43, a),
      make<Str>(43, u16),
      make<Str>(44, tagged("\x80\x81\x9F", kUnknown)),
      make<Str>(45, a),
      make<Str>(46, hex),
      make<Str>(47, bad, k255),
      make<bool>(48, a),
      make<bool>(49, a, k2),
      make<Str>(50, tags),
      make<Str>(50, latin),
      make<Str>(51, tags, utf8("--")),
      make<Str>(51, tags, utf8("\xC3\xA9")),
      make<Str>(52, a, latin, u16, bad, empty, none),
      make<Str>(53, a, a, a, a, a),
      make<Str>(54, a, latin, none, a),
      make<Str>(55, a, empty, a),
      make<Str>(56, a, bad),
      make<Str>(57, sql),
      make<std::int64_t>(58, a, utf8("<&")),
      make<std::int64_t>(59, a, std::int64_t{60}, std::int64_t{62}),
      make<std::int64_t>(60, a, k0, k3, std::int64_t{128}, k255),
      make<std::int64_t>(61, a, k0, k1, k2, k3, k4, std::int64_t{200}),
      make<std::int64_t>(62, a, utf8("&"), k0, k1),
      make<std::int64_t>(63, a, utf8("w"), k0, k1, k2, k3),
      make<std::int64_t>(64, a, utf8("z"), k0, k1, k2, k3, k4, std::int64_t{250}),
  };
  return c;
}

}  // namespace all_functions
