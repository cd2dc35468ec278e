// Mail subjects: the Q encoding and the check of whether a subject needs it,
// for every byte value, against the reference; the rules' worked rows are
// tabled end to end.
#include "encodings/mail_subject.h"

#include <gtest/gtest.h>

#include <string>

#include "common/cpu.h"
#include "tests/reference/mail_subject_reference.h"

namespace zul::encodings {
namespace {

// Every byte value at every position of lengths across the vector widths,
// on every scan level, against the byte-at-a-time reference; and the check
// of whether encoding is needed.
TEST(encode_mail_subject, every_kernel_matches_the_reference) {
  for (const simd::isa level : simd::supported_isas()) {
    SCOPED_TRACE(simd::isa_name(level));
    const scan_kernels& scan = scan_for(level);
    for (std::size_t n = 1; n <= 140; n += (n < 70 ? 1 : 9)) {
      std::string in(n, 'k');
      for (std::size_t at = 0; at < n; ++at) {
        for (unsigned b = at % 11; b < 256; b += (at == n / 2 ? 1 : 41)) {
          in[at] = static_cast<char>(b);
          ASSERT_EQ(encode_mail_subject(in, kMaxResultBytes, scan),
                    zul::reference::encode_mail_subject_reference(in))
              << "n " << n << " at " << at << " byte " << b;
          ASSERT_EQ(subject_needs_encoding(in), b < 32 || b > 127);
        }
        in[at] = 'k';
      }
    }
  }
}

}  // namespace
}  // namespace zul::encodings
