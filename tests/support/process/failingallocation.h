#pragma once

namespace support {

// The next allocation of this thread through operator new throws std::bad_alloc; the ones after it succeed. For a test
// executable that has failingallocation.cpp among its sources. Ends with its lifetime, used or not.
class FailingAllocation
{
public:
    FailingAllocation();
    ~FailingAllocation();
    FailingAllocation(FailingAllocation const&) = delete;
    FailingAllocation& operator=(FailingAllocation const&) = delete;
};

// How many allocations of all threads are not freed yet. For a test executable as above.
long liveAllocations();

} // namespace support
