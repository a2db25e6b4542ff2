#pragma once

#include "libvelmora/output/record.h"

#include <chrono>

namespace velmora {

using SteadyTime = std::chrono::steady_clock::time_point;

// One moment on both clocks: pauses and arithmetic go by the steady one, which nobody sets.
struct WatchTime
{
    SteadyTime steady;
    WallTime wall;
};

} // namespace velmora
