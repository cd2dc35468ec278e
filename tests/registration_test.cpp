// Registration through the stand-in host: the interface version and the
// path (one module, or row by row) chosen by host version, the records the
// host receives, hosts that lack the registration services, and the
// declarations, character for character and in table order.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <optional>
#include <string>
#include <vector>

#include "host/host.h"
#include "tests/declarations.h"

namespace {

using zul_host::Host;
using zul_host::HostConfig;

HostConfig with_version(std::optional<double> version) {
  HostConfig config;
  config.version = version;
  return config;
}

std::vector<std::string> declarations(const zul_host::Registration& r) {
  std::vector<std::string> out;
  for (const auto& m : r.methods) out.push_back(m.declaration);
  return out;
}

TEST(registration, path_and_interface_version_follow_the_host_version) {
  struct {
    std::optional<double> version;
    int want_interface;
    bool want_module;
    const char* why;
  } rows[] = {
      {std::nullopt, 9, false, "no version service"},
      {2011.0, 9, false, "old host"},
      {2012.0, 10, false, "2012.0"},
      {2012.99, 10, false, "just below 2013"},
      {2013.0, 11, true, "2013.0 starts the module path"},
      {2013.03, 12, true, "2013.03"},
      {2013.04, 13, true, "2013.04"},
      {2999.9, 13, true, "last module host"},
      {3000.0, 13, false, "3000.0 goes back to rows"},
      {4100.5, 13, false, "any later host"},
  };
  const std::vector<std::string> want(std::begin(kDeclarations), std::end(kDeclarations));
  bool in_runtime = false;
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    HostConfig config = with_version(row.version);
    config.in_runtime = in_runtime = !in_runtime;  // either way asked once
    Host host(config);
    host.load(ZUL_PLUGIN_PATH);
    EXPECT_EQ(host.lookups("REALinRuntime"), 1);
    EXPECT_EQ(host.lookups("REALGetRBVersion"), 1);
    const auto& r = host.registration();
    ASSERT_TRUE(r.announced_version.has_value());
    EXPECT_EQ(*r.announced_version, row.want_interface);
    ASSERT_FALSE(r.methods.empty());
    const std::uint32_t want_flags = row.want_module ? 20 : 4;
    for (const auto& m : r.methods) {
      EXPECT_EQ(m.flags, want_flags) << m.declaration;
      EXPECT_EQ(m.setter, nullptr);
      EXPECT_EQ(m.attribute_count, 0u);
      EXPECT_EQ(m.attributes, nullptr);
      EXPECT_NE(m.function, nullptr);
    }
    if (row.want_module) {
      EXPECT_EQ(r.module_calls, 1);
      EXPECT_EQ(r.method_calls, 0);
      EXPECT_EQ(r.module_name, "StringGlobalsZUL");
      EXPECT_EQ(r.module_interface_version, static_cast<std::uint32_t>(row.want_interface));
      EXPECT_EQ(r.module_method_count, r.methods.size());
      EXPECT_TRUE(r.module_record_zero_elsewhere);
    } else {
      EXPECT_EQ(r.module_calls, 0);
      EXPECT_EQ(r.method_calls, static_cast<int>(r.methods.size()));
      // Each call hands over the static row itself, in table order.
      for (std::size_t i = 1; i < r.row_addresses.size(); ++i) {
        EXPECT_EQ(r.row_addresses[i], r.row_addresses[i - 1] + 1);
      }
    }
    EXPECT_EQ(declarations(r), want) << "all 64, character for character, in table order";
  }
}

TEST(registration, missing_services) {
  struct {
    std::optional<double> version;
    const char* missing;
    bool want_rows;
    bool want_announce;
    const char* why;
  } rows[] = {
      {std::nullopt, "PluginRegisterMethod", false, true, "no per-method service"},
      {2013.04, "PluginRegisterModule", false, true, "no module service"},
      {2013.04, "PluginRegisterMethod", true, true, "module host needs no per-method service"},
      {2019.0, "RegisterPluginVersion", true, false, "nothing announced"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.why);
    HostConfig config = with_version(row.version);
    config.missing.insert(row.missing);
    Host host(config);
    host.load(ZUL_PLUGIN_PATH);
    EXPECT_EQ(!host.registration().methods.empty(), row.want_rows);
    EXPECT_EQ(host.registration().announced_version.has_value(), row.want_announce);
  }
}

}  // namespace
