// The static method table and its size (see method_table.cpp).
#pragma once

#include <cstddef>

#include "plugin/host_types.h"

extern const GlobalMethodEntry globalMethods[];
extern const std::size_t globalMethodCount;
