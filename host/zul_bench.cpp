// Timing loop of zul bench. Calls are repeated in batches that double until
// one batch takes a tenth of the time asked for, so the clock is read rarely
// even for calls of a few nanoseconds; memcpy is timed the same way on
// buffers of the input's size.
#include "host/zul_bench.h"

#include <chrono>
#include <cstdio>
#include <cstring>
#include <map>
#include <string_view>

#if defined(__unix__) || defined(__APPLE__)
#include <sys/resource.h>
#endif

namespace zul_host {
namespace {

using clock_type = std::chrono::steady_clock;

struct timing {
  std::uint64_t calls = 0;
  double seconds = 0;
  double ns_per_call() const { return calls ? seconds * 1e9 / static_cast<double>(calls) : 0; }
};

template <class F>
timing repeat_for(double seconds, F&& f) {
  timing t;
  std::uint64_t batch = 1;
  const auto start = clock_type::now();
  while (true) {
    for (std::uint64_t k = 0; k < batch; ++k) f();
    t.calls += batch;
    t.seconds = std::chrono::duration<double>(clock_type::now() - start).count();
    if (t.seconds >= seconds) return t;
    if (t.seconds < seconds / 10) batch *= 2;
  }
}

// memcpy through a volatile pointer, so the copies are not optimised away.
void* (*volatile copy_bytes)(void*, const void*, std::size_t) = std::memcpy;

double memcpy_gbps(std::uint64_t bytes, double seconds) {
  const std::size_t n = bytes ? static_cast<std::size_t>(bytes) : 1;
  std::string from(n, 'x'), to(n, '\0');
  copy_bytes(to.data(), from.data(), n);  // touch both buffers first
  const timing t = repeat_for(seconds, [&] { copy_bytes(to.data(), from.data(), n); });
  return static_cast<double>(n) / t.ns_per_call();
}

// Minor page faults of the process so far (first touches of fresh memory),
// or 0 where the system does not count them.
long page_faults() {
#if defined(__unix__) || defined(__APPLE__)
  rusage usage{};
  if (getrusage(RUSAGE_SELF, &usage) == 0) return usage.ru_minflt;
#endif
  return 0;
}

std::string format_number(double value, const char* format) {
  char text[64];
  std::snprintf(text, sizeof text, format, value);
  return text;
}

std::string name_of(const std::string& declaration) {
  return declaration.substr(0, declaration.find('('));
}

}  // namespace

std::uint64_t input_bytes(const std::vector<DynamicValue>& args) {
  std::uint64_t total = 0;
  for (const DynamicValue& a : args) {
    if (a.type == ValueType::string) total += a.string.bytes.size();
    if (a.type == ValueType::memory_block || a.type == ValueType::ptr)
      total += a.block.bytes.size();
  }
  return total;
}

int bench_call(Host& host, const std::string& declaration, const std::vector<DynamicValue>& args,
               const BenchOptions& options, std::ostream& out, std::ostream& err) {
  (void)call_dynamic(host, declaration, args);
  if (const auto& raised = host.last_exception()) {
    err << raised->class_name << ": " << raised->message << "\n";
    return 1;
  }
  if (!host.last_ledger_report().empty()) {
    err << "zul: the host's ledger is not balanced after the call:\n" << host.last_ledger_report();
    return 3;
  }
  timing timed;
  std::map<std::string, long> before, after;
  long faults = 0;
  {
    RepeatedCall call(host, declaration, args);
    repeat_for(options.seconds / 10, [&] { call.invoke(); });  // warm-up
    before = host.conversions();
    faults = page_faults();
    timed = repeat_for(options.seconds, [&] { call.invoke(); });
    faults = page_faults() - faults;
    after = host.conversions();
  }
  const double faults_per_call = static_cast<double>(faults) / static_cast<double>(timed.calls);
  const std::uint64_t bytes = input_bytes(args);
  const double ns = timed.ns_per_call();
  const double gbps = ns > 0 ? static_cast<double>(bytes) / ns : 0;
  const double copy_gbps = memcpy_gbps(bytes, options.seconds / 4);
  // Conversions per call, by "from to to".
  std::map<std::string, double> conversions;
  for (const auto& [label, count] : after) {
    const long added = count - (before.count(label) ? before[label] : 0);
    if (added > 0)
      conversions[label] = static_cast<double>(added) / static_cast<double>(timed.calls);
  }
  if (options.json) {
    out << "{\"name\":\"" << name_of(declaration) << "\",\"calls\":" << timed.calls
        << ",\"ns_per_call\":" << format_number(ns, "%.3f") << ",\"input_bytes\":" << bytes
        << ",\"gbps\":" << format_number(gbps, "%.4f")
        << ",\"memcpy_gbps\":" << format_number(copy_gbps, "%.4f")
        << ",\"page_faults_per_call\":" << format_number(faults_per_call, "%.2f")
        << ",\"host_conversions\":{";
    const char* comma = "";
    for (const auto& [label, per_call] : conversions) {
      out << comma << "\"" << label << "\":" << format_number(per_call, "%.3f");
      comma = ",";
    }
    out << "}}\n";
    return 0;
  }
  out << declaration << "\n"
      << "  " << timed.calls << " calls in " << format_number(timed.seconds, "%.2f")
      << " s: " << format_number(ns, "%.1f") << " ns per call\n"
      << "  input " << bytes << " bytes: " << format_number(gbps, "%.3f")
      << " GB/s; memcpy of as many bytes: " << format_number(copy_gbps, "%.3f") << " GB/s";
  if (copy_gbps > 0 && bytes > 0)
    out << " (" << format_number(100 * gbps / copy_gbps, "%.1f") << "%)";
  out << "\n  page faults per call (first touches of fresh memory): "
      << format_number(faults_per_call, "%.1f");
  out << "\n  text conversions by the host per call: ";
  if (conversions.empty()) out << "none";
  const char* comma = "";
  for (const auto& [label, per_call] : conversions) {
    out << comma << label << " x" << format_number(per_call, "%.3g");
    comma = ", ";
  }
  out << "\n";
  return 0;
}

}  // namespace zul_host
