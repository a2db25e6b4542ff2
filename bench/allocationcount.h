#pragma once

#include <cstddef>

namespace bench {

// Allocations through operator new so far, of all threads. For a benchmark that has allocationcount.cpp among its
// sources.
std::size_t allocationCount();

} // namespace bench
