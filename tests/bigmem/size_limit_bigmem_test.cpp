// Results just past the 0x7FFFFFFF limit with real inputs of hundreds of
// megabytes: one case per gated function, each expecting the null string,
// no host exception, a balanced ledger and a peak of memory that shows no
// oversized buffer was made. Cases run one after another and free their
// inputs before the next, so the process stays under about 7 GiB. Built as its own binary and run
// only by the "bigmem" test preset.
#include <cstdint>
#include <fstream>
#include <string>

#include "tests/declarations.h"
#include "tests/host_fixture.h"

namespace {

using zul_host::Str;
using zul_host::tagged;
using zul_host::utf8;

constexpr std::size_t kMiB = std::size_t{1} << 20;

// A field of /proc/self/status in bytes ("VmRSS", "VmHWM").
std::size_t status_bytes(const std::string& field) {
  std::ifstream status("/proc/self/status");
  std::string key;
  std::size_t kib = 0;
  while (status >> key) {
    if (key == field + ":") {
      status >> kib;
      return kib * 1024;
    }
  }
  return 0;
}

class BigMemory : public HostTest {
 protected:
  // Calls and expects the empty result with nothing raised, and the peak
  // resident memory during the call at most host_copies (the host's copies
  // of the arguments and of the text forms it converts) plus the output
  // that may be written before it passes the limit (growing outputs) plus
  // 256 MiB of slack. An oversized result that is built anyway shows up
  // as a peak of gigabytes more.
  template <class... A>
  void expect_refused(std::size_t host_copies, bool grows, const char* declaration,
                      const A&... args) {
    std::ofstream("/proc/self/clear_refs") << "5";  // resets the peak (VmHWM) to now
    const std::size_t before = status_bytes("VmRSS");
    const Str got = call<Str>(declaration, args...);
    const std::size_t peak = status_bytes("VmHWM");
    EXPECT_TRUE(got.null) << declaration << " gave " << got.bytes.size() << " bytes";
    EXPECT_FALSE(raised()) << declaration << " raised " << raised()->class_name;
    const std::size_t budget = host_copies + (grows ? 0x7FFFFFFF : 0) + 256 * kMiB;
    EXPECT_LE(peak - std::min(peak, before), budget)
        << declaration << ": peak " << (peak >> 20) << " MiB over " << (before >> 20) << " MiB";
  }
};

Str bytes(std::size_t n, char c) { return tagged(std::string(n, c), text_encoding::kUnknown); }

TEST_F(BigMemory, concatenation_of_four_600_mib_strings) {
  const Str part = bytes(600 * kMiB, 'a');
  expect_refused(4 * 600 * kMiB, false, decl(54), part, part, part, part);
}

TEST_F(BigMemory, url_encoding_of_800_mib_of_0xff) {
  expect_refused(800 * kMiB, false, decl(35), bytes(800 * kMiB, '\xFF'), std::int64_t{1});
}

TEST_F(BigMemory, quoted_printable_of_800_mib_of_0xff) {
  expect_refused(800 * kMiB, true, decl(38), bytes(800 * kMiB, '\xFF'), std::int64_t{72});
}

TEST_F(BigMemory, tag_removal_with_a_31_byte_replacement) {
  const Str text = utf8("<" + std::string(100 * kMiB, 'a') + ">");
  expect_refused(100 * kMiB, true, decl(51), text, utf8(std::string(31, 'r')));
}

TEST_F(BigMemory, utf8_repair_with_a_31_byte_placeholder) {
  const std::string bad(100 * kMiB, '\xFF');
  const Str placeholder = utf8(std::string(31, '?'));
  expect_refused(100 * kMiB, true, decl(6), tagged(bad, text_encoding::kUnknown), placeholder);
  expect_refused(0, true, decl(4), static_cast<const void*>(bad.data()),
                 static_cast<std::int64_t>(bad.size()), placeholder);
}

TEST_F(BigMemory, hex_and_hex_dump_of_1_gib) {
  const Str in = bytes(std::size_t{1} << 30, '\x5A');
  expect_refused(kMiB << 10, false, decl(45), in);
  expect_refused(kMiB << 10, false, decl(40), in, std::int64_t{2}, std::int64_t{16}, utf8(""),
                 utf8("\n"), utf8(" "), utf8(""));
}

TEST_F(BigMemory, latin1_to_utf16_of_1_gib) {
  expect_refused(kMiB << 10, false, decl(42), bytes(kMiB << 10, 'e'));
}

TEST_F(BigMemory, xor_and_non_printable_replacement_of_2_2_gib) {
  const Str in = bytes(2200 * kMiB, 'x');
  expect_refused(2200 * kMiB, false, decl(25), in, utf8("k"), std::int64_t{0});
  expect_refused(2200 * kMiB, false, decl(47), in, std::int64_t{46});
}

TEST_F(BigMemory, mail_subject_of_800_mib_of_accented_text) {
  std::string text;
  text.reserve(800 * kMiB);
  while (text.size() < 800 * kMiB) text += "\xC3\xA9";
  // The host's copy, its UTF-8 record and the view's copy of it.
  expect_refused(3 * 800 * kMiB, true, decl(7), utf8(text));
}

TEST_F(BigMemory, html_encoding_of_270_million_accented_letters) {
  std::string text;
  text.reserve(540 * kMiB);
  for (std::size_t i = 0; i < 270'000'000; ++i) text += "\xC3\xA9";  // "&eacute;": 8 bytes each
  // The host's copy, its UTF-32 record (4 bytes a letter) and the view's copy.
  expect_refused(540 * kMiB + 2 * 1080 * kMiB, true, decl(30), utf8(text), std::int64_t{0});
}

TEST_F(BigMemory, xml_escaping_of_110_million_ampersands) {
  // "&amp;" is 5 code points, 20 bytes of UTF-32 for the host.
  // The host's copy and the view's UTF-32 form of it.
  expect_refused(110 * kMiB + 440 * kMiB, true, decl(32), utf8(std::string(110'000'000, '&')),
                 std::int64_t{0});
}

TEST_F(BigMemory, create_string_of_2_gib) {
  expect_refused(0, false, decl(15), std::int64_t{0x80000000}, utf8("ab"));
}

}  // namespace
