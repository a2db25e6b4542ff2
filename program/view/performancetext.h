#pragma once

#include "program/view/framestyle.h"

#include <velmora/performance.h>

#include <string>

namespace velmora::cli {

// What a timed run has come to.
struct PerformanceView
{
    PerformanceRun run;
    bool imperial = false;
    std::string note; // in the place of the keys
};

// The speed in big digits, the times of the goals with their errors, and power and torque by engine speed.
std::string drawPerformance(PerformanceView const& view, FrameStyle const& style);

} // namespace velmora::cli
