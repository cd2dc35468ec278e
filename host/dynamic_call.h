// Calls a registered function by its declaration with arguments whose types
// are known only at run time (the zul tool), through libffi. Each argument is
// turned into the native type its declared type stands for, exactly as
// Host::call does at compile time, and the call closes the same ledger.
#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

#include "host/declaration.h"
#include "host/host.h"

namespace zul_host {

// One argument or result. Only the member of `type` is used: string for
// string, block for memoryblock and for ptr (a ptr argument points at the
// block's bytes, or is null for a null block), array for string(), integer,
// real (double) and boolean.
struct DynamicValue {
  ValueType type = ValueType::none;
  Str string;
  Block block;
  StrArray array;
  std::int64_t integer = 0;
  double real = 0.0;
  bool boolean = false;
};

// Calls the function registered under declaration. The result has the
// declared result type; a raised exception is in host.last_exception() and
// the ledger in host.last_ledger_report(), as after Host::call. Throws
// std::invalid_argument when the declaration is not registered, the
// arguments do not match its parameter types, or the integer that follows a
// ptr argument (its size) is larger than the bytes the ptr holds.
DynamicValue call_dynamic(Host& host, std::string_view declaration,
                          const std::vector<DynamicValue>& args);

}  // namespace zul_host
