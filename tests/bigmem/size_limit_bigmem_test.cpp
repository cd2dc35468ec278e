// Results just past the 0x7FFFFFFF limit with real inputs of hundreds of
// megabytes: one case per gated function, each expecting the null string,
// no host exception and a balanced ledger. Cases run one after another and
// free their inputs before the next, so the process stays under about
// 6 GiB. Built as its own binary and run only by the "bigmem" test preset.
#include <cstdint>
#include <string>

#include "tests/declarations.h"
#include "tests/host_fixture.h"

namespace {

using zul_host::Str;
using zul_host::tagged;
using zul_host::utf8;

constexpr std::size_t kMiB = std::size_t{1} << 20;
const char* decl(int row) { return kDeclarations[row - 1]; }

class BigMemory : public HostTest {
 protected:
  // Calls and expects the empty result with nothing raised.
  template <class... A>
  void expect_refused(const char* declaration, const A&... args) {
    const Str got = call<Str>(declaration, args...);
    EXPECT_TRUE(got.null) << declaration << " gave " << got.bytes.size() << " bytes";
    EXPECT_FALSE(raised()) << declaration << " raised " << raised()->class_name;
  }
};

Str bytes(std::size_t n, char c) { return tagged(std::string(n, c), zul_host::kUnknown); }

TEST_F(BigMemory, concatenation_of_four_600_mib_strings) {
  const Str part = bytes(600 * kMiB, 'a');
  expect_refused(decl(54), part, part, part, part);
}

TEST_F(BigMemory, url_encoding_of_800_mib_of_0xff) {
  expect_refused(decl(35), bytes(800 * kMiB, '\xFF'), std::int64_t{1});
}

TEST_F(BigMemory, quoted_printable_of_800_mib_of_0xff) {
  expect_refused(decl(38), bytes(800 * kMiB, '\xFF'), std::int64_t{72});
}

TEST_F(BigMemory, tag_removal_with_a_31_byte_replacement) {
  const Str text = utf8("<" + std::string(100 * kMiB, 'a') + ">");
  expect_refused(decl(51), text, utf8(std::string(31, 'r')));
}

TEST_F(BigMemory, utf8_repair_with_a_31_byte_placeholder) {
  const std::string bad(100 * kMiB, '\xFF');
  const Str placeholder = utf8(std::string(31, '?'));
  expect_refused(decl(6), tagged(bad, zul_host::kUnknown), placeholder);
  expect_refused(decl(4), static_cast<const void*>(bad.data()),
                 static_cast<std::int64_t>(bad.size()), placeholder);
}

TEST_F(BigMemory, hex_and_hex_dump_of_1_gib) {
  const Str in = bytes(std::size_t{1} << 30, '\x5A');
  expect_refused(decl(45), in);
  expect_refused(decl(40), in, std::int64_t{2}, std::int64_t{16}, utf8(""), utf8("\n"), utf8(" "),
                 utf8(""));
}

TEST_F(BigMemory, latin1_to_utf16_of_1_gib) { expect_refused(decl(42), bytes(kMiB << 10, 'e')); }

TEST_F(BigMemory, xor_and_non_printable_replacement_of_2_2_gib) {
  const Str in = bytes(2200 * kMiB, 'x');
  expect_refused(decl(25), in, utf8("k"), std::int64_t{0});
  expect_refused(decl(47), in, std::int64_t{46});
}

TEST_F(BigMemory, mail_subject_of_800_mib_of_accented_text) {
  std::string text;
  text.reserve(800 * kMiB);
  while (text.size() < 800 * kMiB) text += "\xC3\xA9";
  expect_refused(decl(7), utf8(text));
}

TEST_F(BigMemory, html_encoding_of_270_million_accented_letters) {
  std::string text;
  text.reserve(540 * kMiB);
  for (std::size_t i = 0; i < 270'000'000; ++i) text += "\xC3\xA9";  // "&eacute;": 8 bytes each
  expect_refused(decl(30), utf8(text), std::int64_t{0});
}

TEST_F(BigMemory, xml_escaping_of_110_million_ampersands) {
  // "&amp;" is 5 code points, 20 bytes of UTF-32 for the host.
  expect_refused(decl(32), utf8(std::string(110'000'000, '&')), std::int64_t{0});
}

TEST_F(BigMemory, create_string_of_2_gib) {
  expect_refused(decl(15), std::int64_t{0x80000000}, utf8("ab"));
}

}  // namespace
