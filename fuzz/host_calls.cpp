// Fuzzing through the host interface: each input is one call of one of the
// 64 registered functions, made through the stand-in host on the shipped
// plug-in, with arguments of every declared type read from the input.
// Invariants:
//   1. No crash and no sanitizer report, whatever the arguments.
//   2. The host's ledger balances after every call: every lock released,
//      every string, array and block the library made and did not return
//      released exactly once.
//   3. A raised exception is one of the library's four host classes.
// Input: byte 0 picks the host version (none, 2012.5, 2013.04, 2019), byte 1
// the declaration (its row in the method table); then each argument in
// declared order:
//   string       tag byte: 0xFF null; else encoding = one of 8 by tag & 7,
//                length = next byte, then that many bytes (cut at the end);
//   memoryblock, ptr
//                tag byte 0xFF: null; else length byte and bytes as above
//                (a ptr points at the block's bytes; a size argument right
//                after a ptr is kept within them);
//   integer      tag byte < 0xF0: tag - 0x80; else the next 8 bytes (a
//                value within 32 bits cut to 16 bits);
//   double       the next 8 bytes;
//   boolean      one byte.
#include <array>
#include <cstdint>
#include <cstring>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "fuzz/fuzz_check.h"
#include "host/dynamic_call.h"

#ifndef ZUL_PLUGIN_PATH
#error "ZUL_PLUGIN_PATH must name the built plug-in library"
#endif

namespace {

using zul_fuzz::check;
using zul_host::DynamicValue;
using zul_host::Host;
using zul_host::ValueType;

constexpr std::array<std::optional<double>, 4> kVersions = {std::nullopt, 2012.5, 2013.04, 2019.0};
constexpr std::uint32_t kEncodings[8] = {text_encoding::kUTF8,    text_encoding::kASCII,
                                         text_encoding::kLatin1,  text_encoding::kUTF16,
                                         text_encoding::kUTF32,   text_encoding::kWindowsLatin1,
                                         text_encoding::kUnknown, text_encoding::kMacRoman};

// One Host per version, each with its own private copy of the plug-in; the
// one an input picks is made live for its call.
Host& host_for(std::size_t version) {
  static std::array<std::unique_ptr<Host>, kVersions.size()> hosts = [] {
    std::array<std::unique_ptr<Host>, kVersions.size()> made;
    for (std::size_t i = 0; i < made.size(); ++i) {
      zul_host::HostConfig config;
      config.version = kVersions[i];
      made[i] = std::make_unique<Host>(config);
      made[i]->load(ZUL_PLUGIN_PATH);
    }
    return made;
  }();
  hosts[version]->make_live();
  return *hosts[version];
}

class reader {
 public:
  reader(const std::uint8_t* data, std::size_t size) : p_(data), end_(data + size) {}
  std::uint8_t byte() { return p_ < end_ ? *p_++ : 0; }
  std::string bytes(std::size_t n) {
    n = std::min<std::size_t>(n, static_cast<std::size_t>(end_ - p_));
    std::string out(reinterpret_cast<const char*>(p_), n);
    p_ += n;
    return out;
  }
  std::uint64_t word() {
    std::uint64_t v = 0;
    const std::string b = bytes(8);
    std::memcpy(&v, b.data(), b.size());
    return v;
  }

 private:
  const std::uint8_t* p_;
  const std::uint8_t* end_;
};

DynamicValue argument(ValueType type, reader& in) {
  DynamicValue v;
  v.type = type;
  switch (type) {
    case ValueType::string: {
      const std::uint8_t tag = in.byte();
      if (tag == 0xFF) {
        v.string = zul_host::null_string();
      } else {
        const std::uint32_t encoding = kEncodings[tag & 7];
        v.string = zul_host::tagged(in.bytes(in.byte()), encoding);
      }
      break;
    }
    case ValueType::memory_block:
    case ValueType::ptr:
      if (in.byte() == 0xFF) {
        v.block.null = true;
      } else {
        v.block.bytes = in.bytes(in.byte());
      }
      break;
    case ValueType::integer: {
      const std::uint8_t tag = in.byte();
      v.integer =
          tag < 0xF0 ? static_cast<std::int64_t>(tag) - 0x80 : static_cast<std::int64_t>(in.word());
      // Values of 32 bits are cut to 16, so that a length never asks for
      // hundreds of megabytes of real work; larger ones stay, to meet the
      // size gate (refused before anything is allocated).
      if (v.integer > -(std::int64_t{1} << 31) && v.integer < (std::int64_t{1} << 31))
        v.integer %= std::int64_t{1} << 16;
      break;
    }
    case ValueType::double_: {
      const std::uint64_t bits = in.word();
      std::memcpy(&v.real, &bits, sizeof bits);
      break;
    }
    case ValueType::boolean:
      v.boolean = (in.byte() & 1) != 0;
      break;
    default:
      break;
  }
  return v;
}

bool known_class(const std::string& name) {
  return name == "OutOfMemoryException" || name == "OutOfBoundsException" ||
         name == "RuntimeException" || name == "IllegalCastException";
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  reader in(data, size);
  Host& host = host_for(in.byte() % kVersions.size());
  const auto& methods = host.registration().methods;
  if (methods.empty()) return 0;
  const std::string& declaration = methods[in.byte() % methods.size()].declaration;
  const auto parsed = zul_host::parse_declaration(declaration);
  check(parsed.has_value());

  std::vector<DynamicValue> args;
  for (const zul_host::Parameter& param : parsed->params) {
    args.push_back(argument(param.type, in));
    // A size right after a pointer may not reach past the bytes behind it.
    if (param.type == ValueType::integer && args.size() >= 2 &&
        args[args.size() - 2].type == ValueType::ptr) {
      const auto available = static_cast<std::int64_t>(args[args.size() - 2].block.bytes.size());
      if (args.back().integer > available) args.back().integer = available;
    }
  }
  zul_host::call_dynamic(host, declaration, args);
  check(host.last_ledger_report().empty());
  if (const auto& e = host.last_exception()) check(known_class(e->class_name));
  return 0;
}
