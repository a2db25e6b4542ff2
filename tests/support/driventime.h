#pragma once

#include "libvelmora/watch/watchtime.h"

namespace testsupport {

// Both clocks of a watch, moved by the test.
struct DrivenTime
{
    velmora::WatchTime now{velmora::SteadyTime(std::chrono::hours(100)),
                           velmora::WallTime(std::chrono::milliseconds(1772352900250))};

    velmora::SteadyTime steady() const { return now.steady; }
    void pass(std::chrono::milliseconds time)
    {
        now.steady += time;
        now.wall += time;
    }
};

} // namespace testsupport
