// Fuzz target for the vector kernels. The first byte picks the kernel
// family, the second a parameter (set size, pattern length, operation); the
// rest is the input. Every kernel the machine runs is compared with the
// scalar path on the same input. Invariants:
//  1. no crash, no read or write outside the buffers (outputs are sized
//     exactly, so the sanitizers see any overrun);
//  2. every level's result equals the scalar result, bit for bit.
#include <cstdint>
#include <cstring>
#include <vector>

#include "binary/bitwise_kernels.h"
#include "binary/hex_kernels.h"
#include "common/byte_set.h"
#include "encodings/yenc_kernels.h"
#include "fuzz/fuzz_check.h"
#include "search/count_kernels.h"

using zul_fuzz::check;
namespace simd = zul::simd;

namespace {

template <class Table, class Body>
void each_level(const simd::family_tables<Table>& tables, Body body) {
  for (simd::isa level : simd::supported_isas()) body(simd::kernels_for(tables, level));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size < 2) return 0;
  const int which = data[0] % 6;
  const std::uint8_t param = data[1];
  const std::uint8_t* p = data + 2;
  const std::size_t n = size - 2;
  switch (which) {
    case 0: {  // byte set: the first param % 32 bytes are the members
      const std::size_t k = param % 32 < n ? param % 32 : n;
      const simd::byte_set set = simd::make_byte_set({p, k});
      const std::size_t want = simd::detail::find_first_in_set_scalar(set, p + k, n - k);
      each_level(simd::detail::byte_set_tables(),
                 [&](const auto& t) { check(t.find_first(set, p + k, n - k) == want); });
      break;
    }
    case 1: {  // counting: pattern of 1 + param % 8 bytes from the input
      const std::size_t m = 1 + param % 8;
      if (m > n) break;
      using zul::search::detail::count_tables;
      const auto& s = simd::kernels_for(count_tables(), simd::isa::scalar);
      const std::uint64_t want =
          m == 1 ? s.count_byte(p + 1, n - 1, p[0]) : s.count_pattern(p + m, n - m, p, m);
      each_level(count_tables(), [&](const auto& t) {
        check((m == 1 ? t.count_byte(p + 1, n - 1, p[0]) : t.count_pattern(p + m, n - m, p, m)) ==
              want);
      });
      break;
    }
    case 2: {  // hex encode and decode
      using namespace zul::binary::detail;
      std::vector<char> want(2 * n), got(2 * n);
      encode_hex_scalar(p, n, want.data());
      std::vector<std::uint8_t> want_b(n / 2), got_b(n / 2);
      decode_hex_scalar(reinterpret_cast<const char*>(p), n / 2, want_b.data());
      each_level(hex_tables(), [&](const auto& t) {
        t.encode(p, n, got.data());
        check(got == want);
        t.decode(reinterpret_cast<const char*>(p), n / 2, got_b.data());
        check(got_b == want_b);
      });
      break;
    }
    case 3: {  // yEnc
      using namespace zul::encodings::detail;
      std::vector<std::uint8_t> want(n), got(n);
      want.resize(decode_yenc_scalar(p, n, want.data()));
      each_level(yenc_tables(), [&](const auto& t) {
        got.assign(n, 0);
        got.resize(t.decode(p, n, got.data()));
        check(got == want);
      });
      break;
    }
    default: {  // bitwise run: first half against second half
      using namespace zul::binary::detail;
      const int op = param % 3;
      const std::size_t half = n / 2;
      std::vector<std::uint8_t> want(half), got(half);
      kBitwiseScalar.run[op](p, p + half, want.data(), half);
      each_level(bitwise_tables(), [&](const auto& t) {
        t.run[op](p, p + half, got.data(), half);
        check(got == want);
      });
      break;
    }
  }
  return 0;
}
