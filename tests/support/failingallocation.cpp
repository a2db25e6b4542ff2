#include "tests/support/failingallocation.h"

#include <cstdlib>
#include <new>
#include <utility>

namespace {

thread_local bool failNext = false;

} // namespace

void* operator new(std::size_t size)
{
    if (!std::exchange(failNext, false)) {
        if (void* const memory = std::malloc(size == 0 ? 1 : size)) {
            return memory;
        }
    }
    throw std::bad_alloc();
}

void operator delete(void* memory) noexcept
{
    std::free(memory);
}

void operator delete(void* memory, std::size_t /*size*/) noexcept
{
    std::free(memory);
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

} // namespace support
