#pragma once

namespace support {

// Blocks taken by operator new and not yet given back, of all threads. For a test executable that has
// allocationcount.cpp among its sources.
long liveAllocations();

} // namespace support
