// zul bench: times one registered function end to end through the stand-in
// host in bench mode (no quarantine, the result copied once as a host does)
// and sets it beside memcpy of as many bytes, measured in the same process.
#pragma once

#include <cstdint>
#include <ostream>
#include <string>
#include <vector>

#include "host/dynamic_call.h"
#include "host/host.h"

namespace zul_host {

struct BenchOptions {
  double seconds = 1.0;  // how long the timed repetitions run
  bool json = false;     // one JSON object a line instead of text
};

// The bytes of a call's input: its string, memoryblock and ptr arguments.
std::uint64_t input_bytes(const std::vector<DynamicValue>& args);

// Calls declaration once as a check (a raised exception gives 1, an
// unbalanced ledger 3), warms up, repeats the call for options.seconds and
// prints nanoseconds per call, input GB/s, the GB/s of memcpy of the input
// size, the minor page faults and the text conversions the host performed
// per call. Returns 0.
int bench_call(Host& host, const std::string& declaration, const std::vector<DynamicValue>& args,
               const BenchOptions& options, std::ostream& out, std::ostream& err);

}  // namespace zul_host
