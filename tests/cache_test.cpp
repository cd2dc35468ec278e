// Host service caches, seen from a host that answers some look-ups with null
// at first: a once-only service missing at its first use stays missing for
// the life of the process; a retry service is asked again until it appears.
#include <gtest/gtest.h>

#include "host/host.h"

namespace {

using namespace zul_host;

constexpr const char* kBytes = "InStrBytesZUL(target as string, find as string) as integer";
constexpr const char* kYDecodeMemory = "_yDecodeMemoryZUL(data as memoryblock) as memoryblock";

Host& loaded(Host& host) {
  host.load(ZUL_PLUGIN_PATH);
  return host;
}

HostConfig null_at_first(std::initializer_list<const char*> services) {
  HostConfig config;
  for (const char* s : services) config.null_first.insert(s);
  return config;
}

// Without the lock services (the pair) strings are read unlocked; without
// the length method they read as empty.
TEST(cache_kinds, once_only_services_stay_missing) {
  struct {
    std::initializer_list<const char*> services;
    std::int64_t want;
  } rows[] = {{{"REALLockString", "REALUnlockString"}, 5}, {{"REALLoadGlobalMethod"}, 0}};
  for (const auto& row : rows) {
    SCOPED_TRACE(*row.services.begin());
    Host host(null_at_first(row.services));
    loaded(host);
    for (int i = 0; i < 3; ++i) {
      EXPECT_EQ(host.call<std::int64_t>(kBytes, utf8("hello world"), utf8("ow")), row.want);
      EXPECT_EQ(host.last_ledger_report(), "");
    }
    for (const char* service : row.services) {
      EXPECT_EQ(host.lookups(service), 1);
      EXPECT_EQ(host.service_calls(service), 0);
    }
  }
}

TEST(cache_kinds, retry_size_property_is_asked_again_until_found) {
  Host host(null_at_first({"REALGetPropValueInteger"}));
  loaded(host);
  if (!host.find(kYDecodeMemory)) GTEST_SKIP() << "no memory-block function registered";
  for (int i = 0; i < 3; ++i) {
    EXPECT_EQ(host.call<Block>(kYDecodeMemory, Block{"KKKK"}), Block{"!!!!"});
    EXPECT_EQ(host.last_ledger_report(), "");
  }
  // Null at the first use, found at the second, kept from then on.
  EXPECT_EQ(host.lookups("REALGetPropValueInteger"), 2);
}

TEST(cache_kinds, retry_message_property_is_set_once_it_appears) {
  HostConfig config = null_at_first({"REALSetPropValueString"});
  config.block_cap = 8;
  Host host(config);
  loaded(host);
  if (!host.find(kYDecodeMemory)) GTEST_SKIP() << "no memory-block function registered";
  const Block sixteen{std::string(16, 'K')};
  const std::string message = "Failed to allocate a memoryblock with 16 bytes in size.";

  EXPECT_TRUE(host.call<Block>(kYDecodeMemory, sixteen).null);
  ASSERT_TRUE(host.last_exception().has_value());
  EXPECT_EQ(host.last_exception()->class_name, "OutOfMemoryException");
  EXPECT_EQ(host.last_exception()->message, "") << "the property service was not there yet";

  EXPECT_TRUE(host.call<Block>(kYDecodeMemory, sixteen).null);
  ASSERT_TRUE(host.last_exception().has_value());
  EXPECT_EQ(host.last_exception()->message, message);
  EXPECT_EQ(host.last_ledger_report(), "");
}

}  // namespace
