// The 0x7FFFFFFF result limit without gigabytes: every gated worker at a
// small limit (the output of exactly the limit is built whole, one byte less
// gives the empty result), and the registered functions through a stand-in
// host whose strings claim gigabytes while holding a few bytes, so each
// function must refuse before it reads or allocates anything of that size.
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "binary/byte_strings.h"
#include "common/bytes.h"
#include "common/size_gate.h"
#include "encodings/html.h"
#include "encodings/html_tags.h"
#include "encodings/mail_subject.h"
#include "encodings/quoted_printable.h"
#include "encodings/url.h"
#include "encodings/xml.h"
#include "tests/declarations.h"
#include "tests/host_fixture.h"
#include "text/utf8_repair.h"

namespace {

namespace enc = zul::encodings;
using zul::bytes_of;
using zul_host::Str;
using zul_host::utf8;

// A worker at a given limit, its output's length in units.
struct gated_worker {
  const char* why;
  std::function<std::size_t(std::uint64_t limit)> output_size;
};

template <class Out>
std::function<std::size_t(std::uint64_t)> sized(std::function<Out(std::uint64_t)> worker) {
  return [worker](std::uint64_t limit) { return worker(limit).size(); };
}

TEST(size_gate, every_gated_worker_stops_exactly_at_its_limit) {
  const std::string_view parts_text[] = {"abc", "", "de", "\xFF"};
  std::vector<zul::bytes_view> parts;
  for (std::string_view p : parts_text) parts.push_back(bytes_of(p));
  const std::u32string html_text = U"<p>\u00e9t\u00e9 \U0001F600 & co</p>";
  const zul::encodings::code_point_view html_view(
      reinterpret_cast<const std::uint32_t*>(html_text.data()), html_text.size());
  const std::u32string refs = U"&lt;x&eacute;&#128512;&amp;&bogus; tail";
  const zul::encodings::code_point_view refs_view(
      reinterpret_cast<const std::uint32_t*>(refs.data()), refs.size());
  const std::string qp_input = "h\xC3\xA9llo w\xC3\xB6rld\r\nsecond line with = sign \t\nend";

  const gated_worker workers[] = {
      {"concatenation",
       sized<std::string>([&](auto limit) { return zul::binary::concat_bytes(parts, limit); })},
      {"URL, mixed",
       sized<zul::out_buffer>([](auto limit) { return enc::encode_url("a b+\xFF/z", 1, limit); })},
      {"URL, unreserved only (worst case past the limit, exact size within)",
       sized<zul::out_buffer>([](auto limit) { return enc::encode_url("abcdefgh", 0, limit); })},
      {"quoted-printable", sized<std::string>([&](auto limit) {
         return enc::encode_quoted_printable(qp_input, 12, limit);
       })},
      {"tag removal with a replacement", sized<zul::out_buffer>([](auto limit) {
         return enc::remove_html_tags("a<b>c<dd>e>f", "XY", limit);
       })},
      {"tag removal without one", sized<zul::out_buffer>([](auto limit) {
         return enc::remove_html_tags("ab<x>cd", "", limit);
       })},
      {"UTF-8 repair", sized<zul::out_buffer>([](auto limit) {
         return zul::text::repair_utf8(bytes_of("a\xFF"
                                                "b\xC3\xA9\xFE"),
                                       "<?>", limit);
       })},
      {"UTF-8 repair, blocks dense with faults", sized<zul::out_buffer>([](auto limit) {
         const std::string in = std::string(300, '\xFF') + "\xE2\x82\xAC" + std::string(70, 'x');
         return zul::text::repair_utf8(bytes_of(in), "<?>", limit);
       })},
      {"mail subject", sized<std::string>([](auto limit) {
         return enc::encode_mail_subject("h\xC3\xA9llo w\xC3\xB6rld?", limit);
       })},
      {"HTML encoding",
       sized<zul::out_buffer>([&](auto limit) { return enc::encode_html(html_view, 0, limit); })},
      {"HTML decoding (code points)",
       sized<enc::code_points>([&](auto limit) { return enc::decode_html(refs_view, limit); })},
      {"XML escaping (code points)",
       sized<enc::code_points>([&](auto limit) { return enc::encode_xml(html_view, 1, limit); })},
  };
  for (const gated_worker& w : workers) {
    SCOPED_TRACE(w.why);
    const std::size_t full = w.output_size(zul::kMaxResultBytes);
    ASSERT_GT(full, 1u);
    EXPECT_EQ(w.output_size(full), full) << "an output of exactly the limit is built";
    EXPECT_EQ(w.output_size(full + 1), full);
    EXPECT_EQ(w.output_size(full - 1), 0u) << "one unit less gives the empty result";
    EXPECT_EQ(w.output_size(1), 0u);
    EXPECT_EQ(w.output_size(0), 0u);
  }
}

// Strings that claim more bytes than they hold.
constexpr std::int64_t kThreeGiB = std::int64_t{3} << 30;
constexpr std::int64_t k600MiB = std::int64_t{600} << 20;
constexpr std::int64_t kHexTooLong = 0x40000000;  // two digits a byte: 0x80000000

zul_host::HostConfig claiming_host() {
  zul_host::HostConfig config;
  config.claimed_lengths = {{"3GiB", kThreeGiB}, {"600MiB", k600MiB}, {"1GiB", kHexTooLong}};
  return config;
}

using SizeLimit = HostTestWith<claiming_host>;

TEST_F(SizeLimit, results_past_the_limit_are_null_and_raise_nothing) {
  const Str big = utf8("3GiB"), part = utf8("600MiB"), hex_big = utf8("1GiB"), small = utf8("k");
  const std::int64_t k0 = 0, k1 = 1, k2 = 2, k16 = 16;
  struct row {
    Str got;
    const char* why;
  };
  // Each call is made as the table is built; raised() is checked per call.
  std::vector<std::string> raised_by;
  auto noted = [&](Str result, const char* why) {
    if (raised()) raised_by.push_back(why);
    return row{result, why};
  };
  const row rows[] = {
      noted(call<Str>(decl(56), big, small), "concat 2: 3 GiB + 1"),
      noted(call<Str>(decl(55), small, big, small), "concat 3"),
      noted(call<Str>(decl(54), part, part, part, part), "concat 4 x 600 MiB"),
      noted(call<Str>(decl(53), part, part, part, part, small), "concat 5"),
      noted(call<Str>(decl(52), small, part, part, part, part, small), "concat 6"),
      noted(call<Str>(decl(23), big, small), "AND"),
      noted(call<Str>(decl(24), big, small), "OR"),
      noted(call<Str>(decl(25), big, small, k0), "XOR"),
      noted(call<Str>(decl(26), big, small, k1), "XOR2"),
      noted(call<Str>(decl(45), hex_big), "hex of 1 GiB"),
      noted(call<Str>(decl(40), hex_big, k2, k16, utf8(""), utf8("\n"), utf8(" "), utf8("")),
            "hex dump of 1 GiB"),
      noted(call<Str>(decl(47), big, std::int64_t{46}), "non-printable replacement"),
      noted(call<Str>(decl(34), big), "URL encoding"),
      noted(call<Str>(decl(35), big, k1), "URL encoding with options"),
      noted(call<Str>(decl(42), hex_big), "ISO 8859-1 to UTF-16: 2 bytes a byte"),
      noted(call<Str>(decl(44), hex_big), "Windows-1252 to UTF-16"),
      noted(call<Str>(decl(15), std::int64_t{0x80000000}, utf8("ab")), "CreateString 2^31"),
      noted(call<Str>(decl(14), std::int64_t{0x80000000}, false), "RandomBytes 2^31"),
      noted(call<Str>(decl(40), utf8("ab"), std::int64_t{1} << 40, std::int64_t{1} << 40, utf8(""),
                      utf8(""), utf8(""), utf8("")),
            "hex dump whose one line passes the limit"),
  };
  for (const row& r : rows) EXPECT_TRUE(r.got.null) << r.why;
  EXPECT_TRUE(raised_by.empty()) << "raised by " << raised_by.front();

  // Strings that claim no size of their own still come through.
  EXPECT_TRUE(same(call<Str>(decl(56), utf8("ab"), utf8("cd")), ascii("abcd")));
  EXPECT_TRUE(same(call<Str>(decl(45), utf8("\x01\xAB")), ascii("01AB")));
  EXPECT_TRUE(same(call<Str>(decl(15), std::int64_t{5}, utf8("ab")), utf8("ababa")));

  // A length whose work buffer cannot even be sized keeps its own exception.
  EXPECT_TRUE(call<Str>(decl(15), INT64_MAX, utf8("ab")).null);
  ASSERT_TRUE(raised());
  EXPECT_EQ(raised()->class_name, "OutOfMemoryException");
}

}  // namespace
