#include "tests/support/allocationcount.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace {

std::atomic<long> live{0};

void release(void* memory)
{
    live -= memory != nullptr ? 1 : 0;
    std::free(memory);
}

} // namespace

void* operator new(std::size_t size)
{
    if (void* const memory = std::malloc(size == 0 ? 1 : size)) {
        ++live;
        return memory;
    }
    throw std::bad_alloc();
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

long liveAllocations()
{
    return live;
}

} // namespace support
