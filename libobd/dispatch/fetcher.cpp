#include "libobd/dispatch/fetcher.h"

#include <limits>

namespace obd {
namespace {

constexpr std::chrono::milliseconds queueMargin{50};

} // namespace

std::chrono::milliseconds fetchLimit(unsigned int timeoutMs)
{
    bool const negative = timeoutMs > static_cast<unsigned int>(std::numeric_limits<int>::max());
    return std::chrono::milliseconds(negative ? 0 : timeoutMs) + queueMargin;
}

} // namespace obd
