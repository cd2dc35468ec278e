// Shared by the fuzz targets: a failed invariant aborts, so that libFuzzer
// and the replay driver both report it with the input that broke it.
#pragma once

#include <cstdint>
#include <cstdlib>
#include <span>
#include <string_view>

#include "common/bytes.h"

namespace zul_fuzz {

inline void check(bool ok) {
  if (!ok) std::abort();
}

// The bytes of a string, for the workers that take byte spans.
using zul::bytes_of;

}  // namespace zul_fuzz
