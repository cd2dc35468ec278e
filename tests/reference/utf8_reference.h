// Position-by-position UTF-8 repair: the reference that tests, fuzz targets
// and benchmarks compare the block-kernel repair with.
#pragma once

#include <string>
#include <string_view>

#include "common/bytes.h"

namespace zul::reference {

// Judges every position with the well-formedness table: a well-formed
// sequence is copied, any other byte becomes placeholder.
std::string repair_utf8_reference(bytes_view bytes, std::string_view placeholder);

}  // namespace zul::reference
