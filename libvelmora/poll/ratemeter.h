#pragma once

#include <chrono>
#include <cstddef>
#include <deque>

namespace velmora {

// How often something happened of late, in hertz. Reads no clock.
class RateMeter
{
public:
    using Time = std::chrono::steady_clock::time_point;

    void count(Time now);

    // Over the last events; falls when none come any more. 0 before the second.
    double hertz(Time now) const;

private:
    static constexpr std::size_t most = 32;

    std::deque<Time> m_times;
};

} // namespace velmora
