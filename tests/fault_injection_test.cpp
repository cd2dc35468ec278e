// Allocation failures inside the library, through the host: every one of the
// 64 functions, with several inputs, on host versions 2012.5 and 2013.04,
// is called once to count the allocations n it makes, then n times with
// the k-th allocation failing and n times with every allocation from the
// k-th on failing. Each call must leave the ledger balanced (and, under
// LeakSanitizer, nothing leaked) and give either its correct result or its
// empty result, raising nothing or exactly the exception its function
// prescribes for a failed allocation.
#include <functional>
#include <regex>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "tests/all_functions.h"

#ifdef ZUL_FAULT_PLUGIN_PATH

namespace {

using all_functions::Host;
using all_functions::outcome;

// The functions that report a failed allocation, by declared name, and the
// messages they may raise it with (all as "OutOfMemoryException").
const std::set<std::string, std::less<>> kReporting = {
    "CheckUTF8ZUL",           "EncodingToHTMLZUL",
    "DecodingFromHTMLZUL",    "EncodingToXMLZUL",
    "DecodingFromXMLZUL",     "EncodingToQuotedPrintableZUL",
    "EncodeEmailSubjectZUL",  "RemoveHTMLTagsZUL",
    "RemoveHTMLTagsWithZUL",  "DecodingFromQuotedPrintableZUL",
    "CreateStringZUL",        "HexstringZUL",
    "JaroWinklerDistanceZUL", "LevenshteinDistanceZUL",
    "StrCompCharactersZUL",   "_yDecodeMemoryZUL"};
const std::regex kMessages(
    "Failed to allocate memory\\.|Failed to allocate -?[0-9]+ bytes of memory\\.|"
    "Failed to allocate a memoryblock with [0-9]+ bytes in size\\.");

std::string name_of(std::string_view declaration) {
  return std::string(declaration.substr(0, declaration.find('(')));
}

class AllocationFailures : public ::testing::TestWithParam<double> {};

TEST_P(AllocationFailures, every_function_at_every_allocation) {
  zul_host::HostConfig config;
  config.version = GetParam();
  Host host(config);
  host.load(ZUL_FAULT_PLUGIN_PATH);
  using arm_fn = void (*)(long, int);
  using count_fn = long (*)();
  const auto arm = reinterpret_cast<arm_fn>(host.library_symbol("zul_fault_arm"));
  const auto count = reinterpret_cast<count_fn>(host.library_symbol("zul_fault_count"));
  ASSERT_TRUE(arm && count);

  std::set<int> rows_seen;
  long fault_points = 0;
  for (const all_functions::function_case& c : all_functions::cases()) {
    const std::string name = name_of(decl(c.row));
    SCOPED_TRACE(decl(c.row));
    rows_seen.insert(c.row);
    arm(0, 0);
    const outcome want = c.call(host);
    const long allocations = count();
    ASSERT_EQ(host.last_ledger_report(), "");
    ASSERT_FALSE(host.last_exception()) << host.last_exception()->message;
    for (int from_on = 0; from_on <= 1; ++from_on) {
      for (long k = 1; k <= allocations; ++k) {
        SCOPED_TRACE((from_on ? "every allocation from " : "allocation ") + std::to_string(k) +
                     " of " + std::to_string(allocations));
        arm(k, from_on);
        const outcome got = c.call(host);
        arm(0, 0);
        ++fault_points;
        EXPECT_EQ(host.last_ledger_report(), "");
        if (const auto& e = host.last_exception()) {
          EXPECT_TRUE(kReporting.count(name)) << name << " raised " << e->class_name;
          EXPECT_EQ(e->class_name, "OutOfMemoryException");
          EXPECT_TRUE(std::regex_match(e->message, kMessages)) << e->message;
          EXPECT_TRUE(got.empty) << "raised, yet gave " << got.text;
        } else if (got.text != want.text) {
          EXPECT_TRUE(got.empty) << "gave " << got.text << ", want " << want.text << " or empty";
        }
      }
    }
  }
  EXPECT_EQ(rows_seen.size(), std::size(kDeclarations));
  std::printf("[ fault points ] host %.2f: %zu cases, %ld injected failures\n", GetParam(),
              all_functions::cases().size(), fault_points);
}

INSTANTIATE_TEST_SUITE_P(HostVersions, AllocationFailures, ::testing::Values(2012.5, 2013.04));

}  // namespace

#endif  // ZUL_FAULT_PLUGIN_PATH
