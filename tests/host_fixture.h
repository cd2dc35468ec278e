// Test fixture: a fresh stand-in host with the shipped plug-in loaded, and a
// call() that fails the test when the host's ledger is not balanced after
// the call; the wanted results and inputs the end-to-end tables use.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <string_view>

#include "host/host.h"

#ifndef ZUL_PLUGIN_PATH
#error "ZUL_PLUGIN_PATH must name the built plug-in library"
#endif

// Wanted results: the null string, or bytes with an encoding.
inline zul_host::Str none() { return zul_host::null_string(); }
inline zul_host::Str ascii(std::string_view bytes) {
  return zul_host::tagged(bytes, text_encoding::kASCII);
}
inline zul_host::Str unknown(std::string_view bytes) {
  return zul_host::tagged(bytes, text_encoding::kUnknown);
}
// UTF-16 text in the host's (little-endian) byte order, from code units.
inline zul_host::Str utf16(std::u16string_view units) {
  std::string bytes;
  for (const char16_t u : units) {
    bytes += static_cast<char>(u & 0xFF);
    bytes += static_cast<char>(u >> 8);
  }
  return zul_host::tagged(bytes, text_encoding::kUTF16);
}

// A result equals the wanted one: both null, or the same bytes and encoding.
inline ::testing::AssertionResult same(const zul_host::Str& got, const zul_host::Str& want) {
  if (want.null && got.null) return ::testing::AssertionSuccess();
  if (!want.null && !got.null && got.bytes == want.bytes && got.encoding == want.encoding) {
    return ::testing::AssertionSuccess();
  }
  auto describe = [](const zul_host::Str& s) {
    return s.null ? std::string("null")
                  : "\"" + s.bytes + "\" encoding " + std::to_string(s.encoding);
  };
  return ::testing::AssertionFailure() << "got " << describe(got) << ", want " << describe(want);
}

class HostTest : public ::testing::Test {
 protected:
  explicit HostTest(zul_host::HostConfig config = {}) : host_(std::move(config)) {
    host_.load(ZUL_PLUGIN_PATH);
  }

  template <class R, class... A>
  R call(std::string_view declaration, const A&... args) {
    R result = host_.template call<R>(declaration, args...);
    EXPECT_EQ(host_.last_ledger_report(), "") << "after " << declaration;
    return result;
  }

  const std::optional<zul_host::RaisedException>& raised() const { return host_.last_exception(); }

  zul_host::Host host_;
};

// A HostTest whose host has the configuration that Configure() returns.
template <zul_host::HostConfig (*Configure)()>
class HostTestWith : public HostTest {
 protected:
  HostTestWith() : HostTest(Configure()) {}
};

// Every byte value in order, rounds times over.
inline std::string all_bytes(int rounds = 1) {
  std::string s;
  for (int round = 0; round < rounds; ++round) {
    for (int b = 0; b < 256; ++b) s += static_cast<char>(b);
  }
  return s;
}
