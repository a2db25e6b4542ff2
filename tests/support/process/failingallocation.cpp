#include "tests/support/process/failingallocation.h"

#include <atomic>
#include <cstdlib>
#include <new>
#include <utility>

namespace {

thread_local bool failNext = false;
std::atomic<long> live{0};

void release(void* memory)
{
    if (memory != nullptr) {
        live.fetch_sub(1, std::memory_order_relaxed);
        std::free(memory);
    }
}

} // namespace

void* operator new(std::size_t size)
{
    if (!std::exchange(failNext, false)) {
        if (void* const memory = std::malloc(size == 0 ? 1 : size)) {
            live.fetch_add(1, std::memory_order_relaxed);
            return memory;
        }
    }
    throw std::bad_alloc();
}

// The standard library's sorting asks this way.
void* operator new(std::size_t size, std::nothrow_t const& /*tag*/) noexcept
{
    try {
        return operator new(size);
    } catch (std::bad_alloc const&) {
        return nullptr;
    }
}

void operator delete(void* memory) noexcept
{
    release(memory);
}

void operator delete(void* memory, std::size_t /*size*/) noexcept
{
    release(memory);
}

namespace support {

FailingAllocation::FailingAllocation()
{
    failNext = true;
}

FailingAllocation::~FailingAllocation()
{
    failNext = false;
}

long liveAllocations()
{
    return live;
}

} // namespace support
