// Test fixture: a fresh stand-in host with the shipped plug-in loaded, and a
// call() that fails the test when the host's ledger is not balanced after
// the call.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <string_view>

#include "host/host.h"

#ifndef ZUL_PLUGIN_PATH
#error "ZUL_PLUGIN_PATH must name the built plug-in library"
#endif

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
