// Host adapters for the binary-string functions: each reads its arguments
// through rbData / rbText holders, calls the pure worker and builds the host
// result. Results of raw bytes carry the unknown encoding 0xFFFF (so the
// builder marks all-ASCII results ASCII); hex text is ASCII; readable runs
// are UTF-8. Every function runs inside the silent policy (a failed
// allocation gives the empty result) except CreateStringZUL and HexstringZUL,
// which raise through the shared trap.
#include <array>
#include <cstdint>
#include <limits>
#include <new>
#include <span>
#include <string_view>

#include "binary/bitwise.h"
#include "binary/byte_strings.h"
#include "binary/hex.h"
#include "binary/hex_dump.h"
#include "binary/readable_runs.h"
#include "common/size_gate.h"
#include "plugin/exceptions.h"
#include "plugin/host_services.h"
#include "plugin/natives.h"
#include "plugin/rb_data.h"
#include "plugin/rb_text.h"
#include "plugin/results.h"

namespace {

using text_encoding::kASCII;
using text_encoding::kUnknown;
using text_encoding::kUTF8;

REALstring build_bytes(std::string_view bytes) { return build_string(bytes, kUnknown); }

REALstring concat(REALstring a, REALstring b, REALstring c, REALstring d, REALstring e,
                  REALstring f) {
  const rbData ra(a), rb(b), rc(c), rd(d), re(e), rf(f);
  const std::array parts = {ra.bytes(), rb.bytes(), rc.bytes(), rd.bytes(), re.bytes(), rf.bytes()};
  return build_bytes(zul::binary::concat_bytes(parts));
}

REALarray collect_runs(const void* data, std::int64_t size, std::int64_t min_length) {
  if (size <= 0) return nullptr;
  StringArrayBuilder array;
  if (data) {
    const std::span bytes(static_cast<const std::uint8_t*>(data), static_cast<std::size_t>(size));
    zul::binary::for_each_readable_run(bytes, min_length, [&](std::span<const std::uint8_t> run) {
      array.append({reinterpret_cast<const char*>(run.data()), run.size()}, kUTF8);
    });
  }
  return array.take();
}

}  // namespace

REALstring StringAND(REALstring a, REALstring b) noexcept {
  if (!a || !b) return nullptr;
  return quietly<REALstring>(nullptr, [&] {
    const rbData data(a), mask(b);
    if (!zul::fits_result(data.bytes().size())) return REALstring{};
    return build_bytes(zul::binary::and_with_mask(data.bytes(), mask.bytes()));
  });
}

REALstring StringOR(REALstring a, REALstring b) noexcept {
  if (!a || !b) return nullptr;
  return quietly<REALstring>(nullptr, [&] {
    const rbData data(a), mask(b);
    if (!zul::fits_result(data.bytes().size())) return REALstring{};
    return build_bytes(zul::binary::or_with_mask(data.bytes(), mask.bytes()));
  });
}

REALstring StringXOR(REALstring data, REALstring mask, std::int64_t mask_offset) noexcept {
  if (!data || !mask) return nullptr;
  return quietly<REALstring>(nullptr, [&] {
    const rbData d(data), m(mask);
    if (!zul::fits_result(d.bytes().size())) return REALstring{};
    return build_bytes(zul::binary::xor_with_mask(d.bytes(), m.bytes(), mask_offset));
  });
}

REALstring StringXOR2(REALstring data, REALstring mask, std::int64_t mask_offset) noexcept {
  if (!data || !mask) return nullptr;
  return quietly<REALstring>(nullptr, [&] {
    const rbData d(data), m(mask);
    if (!zul::fits_result(d.bytes().size())) return REALstring{};
    return build_bytes(zul::binary::xor_with_mask_and_position(d.bytes(), m.bytes(), mask_offset));
  });
}

REALstring ConcatBinaryStringsZUL6(REALstring a, REALstring b, REALstring c, REALstring d,
                                   REALstring e, REALstring f) noexcept {
  return quietly<REALstring>(nullptr, [&] { return concat(a, b, c, d, e, f); });
}
REALstring ConcatBinaryStringsZUL5(REALstring a, REALstring b, REALstring c, REALstring d,
                                   REALstring e) noexcept {
  return quietly<REALstring>(nullptr, [&] { return concat(a, b, c, d, e, nullptr); });
}
REALstring ConcatBinaryStringsZUL4(REALstring a, REALstring b, REALstring c,
                                   REALstring d) noexcept {
  return quietly<REALstring>(nullptr, [&] { return concat(a, b, c, d, nullptr, nullptr); });
}
REALstring ConcatBinaryStringsZUL3(REALstring a, REALstring b, REALstring c) noexcept {
  return quietly<REALstring>(nullptr, [&] { return concat(a, b, c, nullptr, nullptr, nullptr); });
}
REALstring ConcatBinaryStringsZUL2(REALstring a, REALstring b) noexcept {
  return quietly<REALstring>(nullptr,
                             [&] { return concat(a, b, nullptr, nullptr, nullptr, nullptr); });
}

REALstring CreateStringZUL(std::int64_t length, REALstring content) noexcept {
  if (length < 1) return nullptr;
  return trapped<REALstring>(nullptr, [&]() -> REALstring {
    const rbData c(content);
    // A length for which length + one pattern unit + 4 is no positive 64-bit
    // size counts as a failed allocation (OutOfMemoryException); the output
    // itself is exactly length bytes.
    const std::int64_t unit = c.length == 0 ? 1 : c.length;
    if (length > std::numeric_limits<std::int64_t>::max() - unit - 4) throw std::bad_alloc();
    if (!zul::fits_result(static_cast<std::uint64_t>(length))) return nullptr;
    const std::string bytes =
        zul::binary::repeat_to_length(c.bytes(), static_cast<std::size_t>(length));
    // A null content has no encoding to ask the host about; its zero bytes
    // go out as raw bytes, which the builder marks ASCII.
    return build_string(bytes, content ? REALGetStringEncoding(content) : kUnknown);
  });
}

REALstring RandomBytesStringZUL(std::int64_t length, signed char ascii) noexcept {
  if (length < 1 || !zul::fits_result(static_cast<std::uint64_t>(length))) return nullptr;
  return quietly<REALstring>(nullptr, [&] {
    const bool as_ascii = ascii != 0;
    const std::string bytes = zul::binary::random_bytes(static_cast<std::size_t>(length), as_ascii);
    return build_string(bytes, as_ascii ? kASCII : kUnknown);
  });
}

REALstring EncodingToHex(REALstring s) noexcept {
  if (!s) return nullptr;
  return quietly<REALstring>(nullptr, [&]() -> REALstring {
    const rbData in(s);
    if (in.length < 1 || !zul::result_size().add_times(2, in.bytes().size()).fits()) return nullptr;
    return build_string(zul::binary::encode_hex(in.bytes()), kASCII);
  });
}

REALstring DecodingToHex(REALstring s) noexcept {
  return quietly<REALstring>(nullptr, [&]() -> REALstring {
    rbText text(s);
    const std::string_view digits = text.ascii();
    if (digits.size() < 2) return nullptr;
    return build_bytes(zul::binary::decode_hex(digits));
  });
}

REALstring Hexstring(REALstring input, std::int64_t hexlen, std::int64_t linelen,
                     REALstring linestart, REALstring lineend, REALstring spacer,
                     REALstring filler) noexcept {
  if (!input || hexlen == 0 || linelen == 0) return nullptr;
  return trapped<REALstring>(nullptr, [&] {
    const rbData in(input), fill(filler);
    const rbData space(spacer), start(linestart), end(lineend);
    const zul::binary::hex_dump_layout layout{hexlen,     linelen,      start.view(),
                                              end.view(), space.view(), fill.view()};
    return build_string(zul::binary::hex_dump(in.bytes(), layout), kASCII);
  });
}

REALarray GetStringsZULp(void* data, std::int64_t size, std::int64_t min_length) noexcept {
  if (size < 0) return nullptr;
  return quietly<REALarray>(nullptr, [&] { return collect_runs(data, size, min_length); });
}

REALarray GetStringsZULm(REALmemoryBlock data, std::int64_t min_length) noexcept {
  if (!data) return nullptr;
  return quietly<REALarray>(nullptr, [&] {
    const rbData block(data);
    return collect_runs(block.data, block.length, min_length);
  });
}

REALarray GetStringsZULs(REALstring data, std::int64_t min_length) noexcept {
  if (!data) return nullptr;
  return quietly<REALarray>(nullptr, [&] {
    const rbData s(data);
    return collect_runs(s.data, s.length, min_length);
  });
}
