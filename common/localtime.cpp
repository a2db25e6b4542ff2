#include <common/localtime.h>

#include <mutex>

namespace tervex {
namespace {

std::mutex& timeMutex()
{
    static std::mutex instance;
    return instance;
}

} // namespace

std::tm toLocalTime(std::time_t seconds)
{
    std::lock_guard const lock(timeMutex());
    std::tm const* fields = std::localtime(&seconds); // NOLINT(concurrency-mt-unsafe): behind the lock
    return fields != nullptr ? *fields : std::tm{};
}

std::time_t fromLocalTime(std::tm fields)
{
    std::lock_guard const lock(timeMutex());
    return std::mktime(&fields);
}

} // namespace tervex
