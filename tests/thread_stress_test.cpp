// Threads: all 64 functions called from 8 threads at once through one
// stand-in host, every result compared with the one a single thread got and
// every call's ledger checked. Under the ThreadSanitizer preset this is the
// race detector's workload: the shared service caches, the memory-block
// method caches and the kernel tables are all first filled here by several
// threads at once (the host is fresh).
#include <atomic>
#include <cstdio>
#include <string>
#include <thread>
#include <vector>

#include "tests/all_functions.h"

namespace {

constexpr int kThreads = 8;
constexpr int kRounds = 20;

TEST(ThreadStress, all_functions_from_eight_threads_match_one_thread) {
  const std::vector<all_functions::function_case> cases = all_functions::cases();
  std::vector<std::string> want;
  {
    // The single-threaded results, from a host of their own so that the
    // threads below meet empty caches.
    zul_host::Host host;
    host.load(ZUL_PLUGIN_PATH);
    for (const auto& c : cases) want.push_back(c.call(host).text);
  }
  zul_host::Host host;
  host.load(ZUL_PLUGIN_PATH);
  std::atomic<long> calls{0}, mismatches{0}, unbalanced{0};
  std::atomic<int> ready{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&, t] {
      ready.fetch_add(1);
      while (ready.load() < kThreads) std::this_thread::yield();  // start together
      for (int round = 0; round < kRounds; ++round) {
        // Each thread walks the table from its own starting point.
        for (std::size_t i = 0; i < cases.size(); ++i) {
          const std::size_t j = (i + static_cast<std::size_t>(t) * 11) % cases.size();
          const all_functions::outcome got = cases[j].call(host);
          calls.fetch_add(1);
          if (got.text != want[j]) mismatches.fetch_add(1);
          if (!host.last_ledger_report().empty()) unbalanced.fetch_add(1);
        }
      }
    });
  }
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(mismatches.load(), 0);
  EXPECT_EQ(unbalanced.load(), 0);
  EXPECT_EQ(calls.load(), long{kThreads} * kRounds * static_cast<long>(cases.size()));
  std::printf("[ threads      ] %ld calls from %d threads\n", calls.load(), kThreads);
}

}  // namespace
